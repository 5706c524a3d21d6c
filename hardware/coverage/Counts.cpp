// Counts: how often cores have met the situations, in blocks, sets and simulations; and files of such counts.
#include "Counts.h"

#include <algorithm>
#include <cstddef>

#include "base/Csv.h"
#include "base/LineReader.h"
#include "base/Numbers.h"
#include "base/Shown.h"
#include "rules/Algorithms.h"

namespace morvik::coverage {

namespace {

constexpr char header[] = "num_pu,algorithm,situation,count";

/// Stands among the situations for the number of blocks.
constexpr char blocksName[] = "blocks";

/// Reads the lines of one core after the other.
class Reader {
public:
    Reader(std::istream& file, const std::string& name)
        : itsLines(file, name, base::LineReader::shortLines), itsRows(itsLines)
    {
    }

    Counts read()
    {
        itsRows.expectHeader(header);
        Counts counts;
        while (itsRows.next()) {
            const CoreCounts next = readCore();
            for (const CoreCounts& each : counts.cores()) {
                if (each.core == next.core) {
                    itsLines.fail("ends the counts of a core that has been counted before");
                }
            }
            counts.add(next);
        }
        if (counts.cores().empty()) {
            itsLines.fail("has no counts");
        }
        return counts;
    }

private:
    CoreCounts readCore()
    {
        expectFields();
        CoreCounts counts;
        counts.core = readName();
        counts.blocks = readCount(counts.core, blocksName);
        for (std::size_t i = 0; i < situations().size(); ++i) {
            const std::string& name = situations()[i].name;
            if (!itsRows.next()) {
                itsLines.fail("is the last line, expected one of " + name);
            }
            expectFields();
            counts.met[i] = readCount(counts.core, name);
        }
        return counts;
    }

    void expectFields() const
    {
        constexpr std::size_t fields = 4;
        if (itsRows.fields().size() != fields) {
            itsLines.fail("has " + std::to_string(itsRows.fields().size()) + " fields, expected 4");
        }
    }

    Core readName() const
    {
        const auto units = base::parseNumber<unsigned>(itsRows.fields()[0]);
        const auto algorithm = rules::findAlgorithm(itsRows.fields()[1]);
        if (!units || (*units != 2 && *units != 4 && *units != 8)) {
            itsLines.fail("num_pu is " + base::shown(itsRows.fields()[0]) + ", expected 2, 4 or 8");
        }
        if (!algorithm) {
            itsLines.fail("algorithm is " + base::shown(itsRows.fields()[1]) + ", expected max-log, scaled or table");
        }
        return {*units, *algorithm};
    }

    std::uint64_t readCount(const Core& core, const std::string& name) const
    {
        if (!(readName() == core)) {
            itsLines.fail("is of another core than the lines before, expected " + name + " of the same");
        }
        if (itsRows.fields()[2] != name) {
            itsLines.fail("situation is " + base::shown(itsRows.fields()[2]) + ", expected " + name);
        }
        const auto count = base::parseNumber<std::uint64_t>(itsRows.fields()[3]);
        constexpr std::uint64_t most = std::uint64_t{1} << 53;  // exact in JSON, too
        if (!count || *count > most) {
            itsLines.fail("count is " + base::shown(itsRows.fields()[3]) + ", expected an integer from 0 to 2^53");
        }
        return *count;
    }

    base::LineReader itsLines;
    base::CsvReader itsRows;
};

}  // namespace

CoreCounts countsOf(const comparison::Model& model)
{
    return countsAt(model, [](const comparison::Place&) { return true; });
}

void Counts::add(const CoreCounts& counts)
{
    const auto same = std::find_if(
        itsCores.begin(), itsCores.end(), [&counts](const CoreCounts& each) { return each.core == counts.core; });
    if (same == itsCores.end()) {
        itsCores.push_back(counts);
        return;
    }
    same->blocks += counts.blocks;
    for (std::size_t i = 0; i < same->met.size(); ++i) {
        same->met[i] += counts.met[i];
    }
}

void Counts::add(const Counts& counts)
{
    for (const CoreCounts& each : counts.cores()) {
        add(each);
    }
}

std::uint64_t Counts::blocks() const
{
    std::uint64_t sum = 0;
    for (const CoreCounts& each : itsCores) {
        sum += each.blocks;
    }
    return sum;
}

std::uint64_t Counts::met(unsigned situation) const
{
    std::uint64_t sum = 0;
    for (const CoreCounts& each : itsCores) {
        sum += each.met[situation];
    }
    return sum;
}

std::optional<std::string> Counts::whyImpossible(unsigned situation) const
{
    std::optional<std::string> why = "there is no core";
    for (const CoreCounts& each : itsCores) {
        why = coverage::whyImpossible(situation, each.core);
        if (!why) {
            break;
        }
    }
    return why;
}

std::vector<unsigned> Counts::missing() const
{
    std::vector<unsigned> numbers;
    for (unsigned number = 0; number < situations().size(); ++number) {
        if (met(number) == 0 && !whyImpossible(number)) {
            numbers.push_back(number);
        }
    }
    return numbers;
}

std::string summary(const Counts& counts, std::size_t longest)
{
    std::size_t possible = 0;
    for (unsigned number = 0; number < situations().size(); ++number) {
        possible += counts.whyImpossible(number) ? 0U : 1U;
    }
    const std::vector<unsigned> missing = counts.missing();
    std::string text = std::to_string(possible - missing.size()) + " of " + std::to_string(possible) + " met";
    const std::size_t named = std::min(missing.size(), longest);
    for (std::size_t i = 0; i < named; ++i) {
        text += (i == 0 ? "; missing: " : ", ") + situations()[missing[i]].name;
    }
    return text +
           (named > 0 && named < missing.size() ? " and " + std::to_string(missing.size() - named) + " more" : "");
}

std::string textOf(const Counts& counts)
{
    std::string text = std::string(header) + '\n';
    for (const CoreCounts& each : counts.cores()) {
        const std::string core =
            std::to_string(each.core.units) + ',' + std::string(rules::algorithmNames.at(each.core.algorithm)) + ',';
        text += core + blocksName + ',' + std::to_string(each.blocks) + '\n';
        for (std::size_t i = 0; i < each.met.size(); ++i) {
            text += core + situations()[i].name + ',' + std::to_string(each.met[i]) + '\n';
        }
    }
    return text;
}

Counts readCounts(std::istream& file, const std::string& name)
{
    return Reader(file, name).read();
}

}  // namespace morvik::coverage

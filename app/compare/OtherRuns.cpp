// OtherRuns: finds other options or inputs with which the model reproduces a dump.
#include "OtherRuns.h"

#include <filesystem>
#include <system_error>
#include <vector>

#include "SoftValueReader.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/Path.h"
#include "hardware/comparison/Model.h"
#include "hardware/diagnosis/Mistakes.h"
#include "simulation/Point.h"

namespace morvik {

namespace {

/// "--num-pu 4 or 8", the unit counts whose core computes the dump; empty text if that of `run` does; nothing if none
/// do.
std::optional<std::string> unitsThatFit(ComparedRun run, const comparison::Values& dump)
{
    std::string units;
    const std::int32_t own = run.generics.C_NUM_PU;
    for (const std::int32_t each : {2, 4, 8}) {
        run.generics.C_NUM_PU = each;
        if (comparison::computesAll(run.block, run.generics, dump)) {
            if (each == own) {
                return "";
            }
            units += (units.empty() ? "--num-pu " : " or ") + std::to_string(each);
        }
    }
    return units.empty() ? std::nullopt : std::optional(units);
}

/// Prefers another unit count alone to another algorithm: it is the stronger finding.
std::vector<std::string> findCores(const ComparedRun& run, const comparison::Values& dump)
{
    std::vector<std::string> found;
    for (const std::int32_t algorithm : {0, 1, 2}) {
        ComparedRun other = run;
        other.generics.C_ALGORITHM_TYPE = algorithm;
        const auto units = unitsThatFit(other, dump);
        if (units && algorithm == run.generics.C_ALGORITHM_TYPE) {
            return {"with " + *units};
        }
        if (units) {
            found.push_back("with --algorithm " + simulation::algorithmName(static_cast<unsigned>(algorithm)) +
                            (units->empty() ? "" : " and " + *units));
        }
    }
    return found;
}

constexpr std::size_t mostBlocks = 4;  ///< named at most

std::vector<std::string> findBlocks(const ComparedRun& run, const comparison::Values& dump)
{
    std::vector<std::string> found;
    std::error_code ignored;
    if (!std::filesystem::is_regular_file(base::pathOf(run.file), ignored)) {
        return found;  // it cannot be read again
    }
    try {
        base::InputFile input(run.file);
        SoftValueReader reader(input.stream(), input.name());
        SoftBlock block;
        for (std::uint32_t number = 0; reader.next(block) && found.size() < mostBlocks; ++number) {
            if (number != run.number && block.size() == run.block.size() &&
                comparison::computesAll(block, run.generics, dump)) {
                found.push_back("of block " + std::to_string(number) + " of " + run.file);
            }
        }
    } catch (const base::Error&) {
        // The rest of the file need not hold valid blocks.
    }
    return found;
}

/// Each single mistake that preserves the block size.
std::vector<diagnosis::Mistakes> allMistakes()
{
    std::vector<diagnosis::Mistakes> all;
    const auto add = [&all](auto member, auto value) {
        all.emplace_back();
        all.back().*member = value;
    };
    for (unsigned columns = 1; columns < 8; ++columns) {
        add(&diagnosis::Mistakes::flipped, columns);
    }
    for (std::size_t i = 1; i < diagnosis::columnContents.size(); ++i) {
        add(&diagnosis::Mistakes::columns, i);
    }
    for (std::size_t i = 1; i < diagnosis::tailContents.size(); ++i) {
        add(&diagnosis::Mistakes::tail, i);
    }
    for (const int doublings : {-3, -2, -1, 1, 2, 3}) {
        add(&diagnosis::Mistakes::doublings, doublings);
    }
    add(&diagnosis::Mistakes::order, diagnosis::Order::rowsReversed);
    add(&diagnosis::Mistakes::order, diagnosis::Order::dataReversed);
    return all;
}

std::vector<std::string> findMistakes(const ComparedRun& run, const comparison::Values& dump)
{
    std::vector<std::string> found;
    for (const diagnosis::Mistakes& mistakes : allMistakes()) {
        if (comparison::computesAll(diagnosis::undone({run.block, {}}, mistakes).received, run.generics, dump)) {
            found.push_back("if, in the block, " + diagnosis::explain(mistakes).front().what);
        }
    }
    return found;
}

}  // namespace

std::vector<std::string> findOtherRuns(const ComparedRun& run, const comparison::Values& dump)
{
    std::vector<std::string> found;
    for (const auto find : {findCores, findBlocks, findMistakes}) {
        const std::vector<std::string> more = find(run, dump);
        found.insert(found.end(), more.begin(), more.end());
    }
    return found;
}

}  // namespace morvik

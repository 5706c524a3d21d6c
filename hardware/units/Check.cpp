// Check: computes the tables of units in a folder again.
#include "Check.h"

#include <algorithm>
#include <cstddef>
#include <filesystem>
#include <memory>
#include <system_error>

#include "base/Checksum.h"
#include "base/Error.h"
#include "base/TextFile.h"

namespace morvik::units {

namespace {

std::string pathOf(const std::string& folder, const std::string& name)
{
    return folder + '/' + name;
}

void expectUnchanged(const std::string& folder, const Description& description)
{
    for (const DescribedFormat& format : description.formats) {
        for (const DescribedFormat::File& file : format.files) {
            const std::string path = pathOf(folder, file.name);
            if (base::sha256(path) != file.sha256) {
                throw base::Error(path + ": has changed since it was written: its sha256 differs from " +
                                  descriptionName(description.unit));
            }
        }
    }
}

/// Refuses tables that the description does not name: they would be taken for checked.
void expectNoOtherTable(const std::string& folder, const Description& description)
{
    const tables::Table table = tableOf(description.unit, description.algorithm);
    for (const tables::Format& format : tables::formats()) {
        const bool isNamed = std::any_of(description.formats.begin(),
                                         description.formats.end(),
                                         [&format](const DescribedFormat& each) { return each.name == format.name; });
        const std::string path = pathOf(folder, format.files(table).front());
        if (!isNamed && std::filesystem::exists(path)) {
            throw base::Error(path + ": is not a file that " + descriptionName(description.unit) +
                              " names, and cannot be checked");
        }
    }
}

/// Compares the rows of a table with what the unit computes.
class TableCheck {
public:
    TableCheck(const std::string& folder, const DescribedFormat& format, const Description& description)
        : itsDescription(description),
          itsTable(tableOf(description.unit, description.algorithm)),
          itsName(format.name),
          itsReader(tables::findFormat(format.name)->reader(folder, itsTable)),
          itsSituations(description.unit, description.algorithm)
    {
    }

    std::optional<std::string> difference()
    {
        tables::Row row;
        for (; itsReader->next(row); ++itsCases) {
            if (auto found = differenceOf(row)) {
                return found;
            }
        }
        return std::nullopt;
    }

    /// Throws unless the cases are as many as described, and meet what is described.
    void expectAsDescribed(const std::string& fileName) const
    {
        if (itsCases != itsDescription.cases()) {
            throw base::Error(fileName + ": tells " + std::to_string(itsDescription.cases()) + " cases, " + itsName +
                              " has " + std::to_string(itsCases));
        }
        for (std::size_t i = 0; i < itsSituations.all().size(); ++i) {
            const Situation& met = itsSituations.all()[i];
            if (met.counts != itsDescription.situations[i].counts) {
                throw base::Error(fileName + ": has another count of \"" + met.name + "\" than the cases in " +
                                  itsName);
            }
        }
    }

private:
    std::optional<std::string> differenceOf(const tables::Row& row)
    {
        const std::vector<std::int32_t> inputs = inputsOf(itsDescription.unit, itsDescription.algorithm, row);
        std::vector<std::int32_t> outputs;
        try {
            outputs = compute(itsDescription.unit, itsDescription.algorithm, inputs);
        } catch (const BadInput& error) {
            throw base::Error(itsReader->place() + ": " + error.what());
        }
        itsSituations.add(inputs, outputs);
        const tables::Row expected = rowOf(itsDescription.unit, itsDescription.algorithm, inputs, outputs);
        const auto [wrong, right] = std::mismatch(row.begin(), row.end(), expected.begin(), expected.end());
        if (wrong == row.end()) {
            return std::nullopt;
        }
        return itsName + ", case " + std::to_string(itsCases) + ": " +
               itsTable.columns[static_cast<std::size_t>(wrong - row.begin())].name + " is " + std::to_string(*right) +
               ", " + itsTable.name + " says " + std::to_string(*wrong);
    }

    const Description& itsDescription;
    tables::Table itsTable;
    std::string itsName;
    std::unique_ptr<tables::TableReader> itsReader;
    Situations itsSituations;
    std::uint64_t itsCases = 0;
};

}  // namespace

std::vector<Number> unitsIn(const std::string& folder)
{
    std::vector<Number> found;
    for (std::size_t number = 0; number < allUnits().size(); ++number) {
        const auto unit = static_cast<Number>(number);
        std::error_code ignored;  // what cannot be looked at is not there
        if (std::filesystem::exists(pathOf(folder, descriptionName(unit)), ignored)) {
            found.push_back(unit);
        }
    }
    return found;
}

std::vector<std::string> filesOf(const std::string& folder, const Description& description)
{
    std::vector<std::string> files = {pathOf(folder, descriptionName(description.unit))};
    for (const DescribedFormat& format : description.formats) {
        for (const DescribedFormat::File& file : format.files) {
            files.push_back(pathOf(folder, file.name));
        }
    }
    return files;
}

CheckedUnit checkUnit(const std::string& folder, Number unit)
{
    const std::string fileName = pathOf(folder, descriptionName(unit));
    base::expectRegularFile(fileName);
    CheckedUnit checked;
    checked.description = parseDescription(base::readText(fileName), fileName, unit);
    expectUnchanged(folder, checked.description);
    for (const DescribedFormat& format : checked.description.formats) {
        TableCheck check(folder, format, checked.description);
        checked.difference = check.difference();
        if (checked.difference) {
            return checked;
        }
        check.expectAsDescribed(fileName);
    }
    expectNoOtherTable(folder, checked.description);
    return checked;
}

}  // namespace morvik::units

// CsvFormat: tables as comma-separated values; each row opens with the number of its block.
#include <utility>

#include "Formats.h"
#include "Numbers.h"
#include "base/Csv.h"
#include "hardware/testbench/LineFile.h"
#include "simulation/Shown.h"

namespace morvik::vectors {

namespace {

std::string fileOf(const std::string& folder, const Table& table)
{
    return folder + '/' + table.name + ".csv";
}

std::string header(const Table& table)
{
    std::string line = "block";
    for (const Column& column : table.columns) {
        line += ',' + column.name;
    }
    return line;
}

class CsvWriter : public TableWriter {
public:
    CsvWriter(base::OutputFile file, const Table& table) : itsFile(std::move(file))
    {
        itsFile.write(header(table) + '\n');
    }

    void add(std::uint32_t block, const Row& row) override
    {
        itsLine = std::to_string(block);
        for (const std::int64_t value : row) {
            itsLine += ',';
            itsLine += std::to_string(value);
        }
        itsLine += '\n';
        itsFile.write(itsLine);
    }

    void finish() override
    {
        itsFile.commit();
    }

private:
    base::OutputFile itsFile;
    std::string itsLine;
};

class CsvReader : public TableReader {
public:
    CsvReader(const std::string& folder, Table table) : itsTable(std::move(table)), itsFile(fileOf(folder, itsTable))
    {
        if (!itsFile.next() || base::fieldsOf(itsFile.line()) != base::fieldsOf(header(itsTable))) {
            itsFile.fail("expected \"" + header(itsTable) + '"');
        }
    }

    bool next(Row& row) override
    {
        if (!itsFile.next()) {
            return false;
        }
        std::string_view rest = itsFile.line();
        takeBlanks(rest);
        itsBlock = takeInteger(rest);
        bool isRow = itsBlock.has_value();
        row.resize(itsTable.columns.size());
        for (std::size_t i = 0; isRow && i < row.size(); ++i) {
            takeBlanks(rest);
            const bool isNext = take(rest, ",");
            takeBlanks(rest);
            const auto value = isNext ? takeInteger(rest) : std::nullopt;
            isRow = value.has_value();
            row[i] = value.value_or(0);
        }
        takeBlanks(rest);
        if (!isRow || !rest.empty()) {
            itsFile.fail("row " + simulation::shown(itsFile.line()) + ", expected " + std::to_string(row.size() + 1) +
                         " decimal integers with commas between them");
        }
        checkFits(row, itsTable, *this);
        return true;
    }

    std::optional<std::int64_t> block() const override
    {
        return itsBlock;
    }

    std::string place() const override
    {
        return itsFile.place();
    }

private:
    Table itsTable;
    LineFile itsFile;
    std::optional<std::int64_t> itsBlock;
};

}  // namespace

std::unique_ptr<TableWriter> csvWriter(base::OutputFile file, const Table& table)
{
    return std::make_unique<CsvWriter>(std::move(file), table);
}

const Format csvFormat = {"csv",
                          [](const Table& table) { return std::vector<std::string>{table.name + ".csv"}; },
                          [](const std::string& folder, const Table& table) -> std::unique_ptr<TableWriter> {
                              return csvWriter(base::OutputFile(fileOf(folder, table)), table);
                          },
                          [](const std::string& folder, const Table& table) -> std::unique_ptr<TableReader> {
                              return std::make_unique<CsvReader>(folder, table);
                          }};

}  // namespace morvik::vectors

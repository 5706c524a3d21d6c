// CsvFormat: tables as comma-separated values; each row opens with the number of its block.
#include <utility>

#include "Formats.h"
#include "base/Csv.h"
#include "base/InputFile.h"
#include "base/LineReader.h"
#include "base/Numbers.h"
#include "base/Shown.h"

namespace morvik::tables {

namespace {

std::string csvFile(const std::string& folder, const Table& table)
{
    return folder + '/' + table.name + ".csv";
}

std::string csvHeader(const Table& table)
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
        itsFile.write(csvHeader(table) + '\n');
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
    CsvReader(const std::string& folder, Table table)
        : itsTable(std::move(table)),
          itsFile(base::openFile(csvFile(folder, itsTable))),
          itsLines(itsFile, csvFile(folder, itsTable), base::LineReader::longLines)
    {
        if (!itsRow.next() || !itsRow.is(csvHeader(itsTable))) {
            itsLines.fail("expected \"" + csvHeader(itsTable) + '"');
        }
    }

    bool next(Row& row) override
    {
        if (!itsRow.next()) {
            return false;
        }
        row.resize(itsTable.columns.size());
        itsBlock = number(0);
        bool isRow = itsRow.fields().size() == row.size() + 1 && itsBlock;
        for (std::size_t i = 0; isRow && i < row.size(); ++i) {
            const auto value = number(i + 1);
            isRow = value.has_value();
            row[i] = value.value_or(0);
        }
        if (!isRow) {
            itsLines.fail("row " + base::shown(itsLines.text()) + ", expected " + std::to_string(row.size() + 1) +
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
        return itsLines.place();
    }

private:
    std::optional<std::int64_t> number(std::size_t field) const
    {
        return base::parseNumber<std::int64_t>(itsRow.fields()[field]);
    }

    Table itsTable;
    std::ifstream itsFile;
    base::LineReader itsLines;
    base::CsvReader itsRow{itsLines};
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
                              return csvWriter(base::OutputFile(csvFile(folder, table)), table);
                          },
                          [](const std::string& folder, const Table& table) -> std::unique_ptr<TableReader> {
                              return std::make_unique<CsvReader>(folder, table);
                          }};

}  // namespace morvik::tables

// MemhFormat: tables as words for $readmemh: a row is a word of hexadecimal digits, its first column in the lowest.
#include <utility>

#include "Formats.h"
#include "base/InputFile.h"
#include "base/LineReader.h"
#include "base/Numbers.h"
#include "base/Shown.h"

namespace morvik::tables {

namespace {

constexpr unsigned bitsOfDigit = 4;

unsigned digitsOf(const Column& column)
{
    return (column.bits + bitsOfDigit - 1) / bitsOfDigit;
}

std::string memhFile(const std::string& folder, const Table& table)
{
    return folder + '/' + table.name + ".memh";
}

/// "// stimulus: hexadecimal digits of a word, from the left: rsc2_par 2, rsc1_par 2, rsc1_sys 2"
std::string layout(const Table& table)
{
    std::string columns;
    for (const Column& column : table.columns) {
        columns.insert(0, ", " + column.name + ' ' + std::to_string(digitsOf(column)));
    }
    columns.erase(0, 2);
    return "// " + table.name + ": hexadecimal digits of a word, from the left: " + columns + '\n';
}

class MemhWriter : public TableWriter {
public:
    MemhWriter(const std::string& folder, Table table) : itsTable(std::move(table)), itsFile(memhFile(folder, itsTable))
    {
        itsFile.write(layout(itsTable));
    }

    void add(std::uint32_t, const Row& row) override
    {
        itsWord.clear();
        for (std::size_t i = row.size(); i-- > 0;) {
            for (unsigned digit = digitsOf(itsTable.columns[i]); digit-- > 0;) {
                itsWord += "0123456789abcdef"[static_cast<std::uint64_t>(row[i]) >> bitsOfDigit * digit & 0xF];
            }
        }
        itsWord += '\n';
        itsFile.write(itsWord);
    }

    void finish() override
    {
        itsFile.commit();
    }

private:
    Table itsTable;
    base::OutputFile itsFile;
    std::string itsWord;
};

class MemhReader : public TableReader {
public:
    MemhReader(const std::string& folder, Table table)
        : itsTable(std::move(table)),
          itsFile(base::openFile(memhFile(folder, itsTable))),
          itsLines(itsFile, memhFile(folder, itsTable), base::LineReader::longLines)
    {
        for (const Column& column : itsTable.columns) {
            itsDigits += digitsOf(column);
        }
    }

    bool next(Row& row) override
    {
        do {
            if (!itsLines.next()) {
                return false;
            }
        } while (itsLines.text().empty() || itsLines.text().rfind("//", 0) == 0);
        if (itsLines.text().size() != itsDigits) {
            fail();
        }
        row.resize(itsTable.columns.size());
        std::size_t end = itsDigits;
        for (std::size_t i = 0; i < row.size(); ++i) {
            const Column& column = itsTable.columns[i];
            end -= digitsOf(column);
            row[i] = value(itsLines.text().substr(end, digitsOf(column)), column);
        }
        checkFits(row, itsTable, *this);
        return true;
    }

    std::string place() const override
    {
        return itsLines.place();
    }

private:
    [[noreturn]] void fail() const
    {
        itsLines.fail("word " + base::shown(itsLines.text()) + ", expected " + std::to_string(itsDigits) +
                      " hexadecimal digits");
    }

    std::int64_t value(std::string_view digits, const Column& column) const
    {
        const auto word = base::parseNumber<std::uint64_t>(digits, 16);
        if (!word) {
            fail();
        }
        const std::int64_t range = std::int64_t{1} << bitsOfDigit * digits.size();
        const auto unsignedValue = static_cast<std::int64_t>(*word);
        return column.isSigned && unsignedValue >= range / 2 ? unsignedValue - range : unsignedValue;
    }

    Table itsTable;
    std::ifstream itsFile;
    base::LineReader itsLines;
    std::size_t itsDigits = 0;
};

}  // namespace

const Format memhFormat = {"memh",
                           [](const Table& table) { return std::vector<std::string>{table.name + ".memh"}; },
                           [](const std::string& folder, const Table& table) -> std::unique_ptr<TableWriter> {
                               return std::make_unique<MemhWriter>(folder, table);
                           },
                           [](const std::string& folder, const Table& table) -> std::unique_ptr<TableReader> {
                               return std::make_unique<MemhReader>(folder, table);
                           }};

}  // namespace morvik::tables

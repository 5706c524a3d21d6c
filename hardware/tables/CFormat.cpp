// CFormat: tables as arrays in C, a source and a header each.
#include <algorithm>
#include <cctype>
#include <utility>

#include "Formats.h"
#include "base/InputFile.h"
#include "base/LineReader.h"
#include "base/Numbers.h"
#include "base/Shown.h"

namespace morvik::tables {

namespace {

constexpr char end[] = "};";

std::string cFile(const std::string& folder, const Table& table)
{
    return folder + '/' + table.name + ".c";
}

std::string typeOf(const Table& table)
{
    const Storage storage = storageOf(table);
    return (storage.isSigned ? "int" : "uint") + std::to_string(storage.bits) + "_t";
}

/// MORVIK_STIMULUS_ROWS
std::string rowsMacro(const Table& table)
{
    std::string name = table.name;
    std::transform(
        name.begin(), name.end(), name.begin(), [](unsigned char c) { return static_cast<char>(std::toupper(c)); });
    return "MORVIK_" + name + "_ROWS";
}

/// "const int8_t morvik_stimulus[MORVIK_STIMULUS_ROWS][3]"
std::string declaration(const Table& table)
{
    std::string text = "const " + typeOf(table) + " morvik_" + table.name + '[' + rowsMacro(table) + ']';
    if (table.columns.size() > 1) {
        text += '[' + std::to_string(table.columns.size()) + ']';
    }
    return text;
}

/// The line after which the rows begin.
std::string beginning(const Table& table)
{
    return declaration(table) + " = {";
}

std::string headerText(const Table& table, std::uint64_t rows)
{
    const std::string guard = rowsMacro(table);
    std::string columns;
    for (const Column& column : table.columns) {
        columns += (columns.empty() ? "" : ", ") + column.name;
    }
    return "/* Columns: " + columns + " */\n#ifndef " + guard + "\n#define " + guard + ' ' + std::to_string(rows) +
           "\n\n#include <stdint.h>\n\nextern " + declaration(table) + ";\n\n#endif\n";
}

class CWriter : public TableWriter {
public:
    CWriter(std::string folder, Table table)
        : itsFolder(std::move(folder)), itsTable(std::move(table)), itsFile(cFile(itsFolder, itsTable))
    {
        itsFile.write("#include \"" + itsTable.name + ".h\"\n\n" + beginning(itsTable) + '\n');
        itsSuffix = storageOf(itsTable).isSigned ? "" : "U";
    }

    void add(std::uint32_t, const Row& row) override
    {
        const bool isArray = row.size() > 1;
        itsLine = isArray ? "    {" : "    ";
        for (std::size_t i = 0; i < row.size(); ++i) {
            itsLine += (i > 0 ? ", " : "") + std::to_string(row[i]) + itsSuffix;
        }
        itsLine += isArray ? "},\n" : ",\n";
        itsFile.write(itsLine);
        ++itsRows;
    }

    void finish() override
    {
        itsFile.write(end + std::string("\n"));
        itsFile.commit();
        base::OutputFile header(itsFolder + '/' + itsTable.name + ".h");
        header.write(headerText(itsTable, itsRows));
        header.commit();
    }

private:
    std::string itsFolder;
    Table itsTable;
    base::OutputFile itsFile;
    std::string itsSuffix;
    std::string itsLine;
    std::uint64_t itsRows = 0;
};

class CReader : public TableReader {
public:
    CReader(const std::string& folder, Table table)
        : itsTable(std::move(table)),
          itsFile(base::openFile(cFile(folder, itsTable))),
          itsLines(itsFile, cFile(folder, itsTable), base::LineReader::longLines)
    {
        do {
            if (!itsLines.next()) {
                itsLines.fail("no line \"" + beginning(itsTable) + '"');
            }
        } while (itsLines.text() != beginning(itsTable));
    }

    bool next(Row& row) override
    {
        if (!itsLines.next()) {
            itsLines.fail(std::string("no line \"") + end + '"');
        }
        if (itsLines.text() == end) {
            return false;
        }
        if (!readRow(row)) {
            itsLines.fail("row " + base::shown(itsLines.text()) + ", expected " +
                          std::to_string(itsTable.columns.size()) + " decimal integers as they were written");
        }
        checkFits(row, itsTable, *this);
        return true;
    }

    std::string place() const override
    {
        return itsLines.place();
    }

private:
    bool readRow(Row& row) const
    {
        row.resize(itsTable.columns.size());
        const bool isArray = row.size() > 1;
        const char* const suffix = storageOf(itsTable).isSigned ? "" : "U";
        std::string_view rest = itsLines.text();
        bool isRow = base::take(rest, isArray ? "    {" : "    ");
        for (std::size_t i = 0; isRow && i < row.size(); ++i) {
            const auto value = i == 0 || base::take(rest, ", ") ? base::takeInteger(rest) : std::nullopt;
            isRow = value.has_value() && base::take(rest, suffix);
            row[i] = value.value_or(0);
        }
        return isRow && base::take(rest, isArray ? "}," : ",") && rest.empty();
    }

    Table itsTable;
    std::ifstream itsFile;
    base::LineReader itsLines;
};

}  // namespace

const Format cFormat = {"c",
                        [](const Table& table) {
                            return std::vector<std::string>{table.name + ".c", table.name + ".h"};
                        },
                        [](const std::string& folder, const Table& table) -> std::unique_ptr<TableWriter> {
                            return std::make_unique<CWriter>(folder, table);
                        },
                        [](const std::string& folder, const Table& table) -> std::unique_ptr<TableReader> {
                            return std::make_unique<CReader>(folder, table);
                        }};

}  // namespace morvik::tables

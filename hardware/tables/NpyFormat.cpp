// NpyFormat: tables as arrays of NumPy: rows of columns, a table of one column as a plain row of numbers.
#include <array>
#include <fstream>
#include <utility>

#include "Formats.h"
#include "base/Error.h"
#include "base/InputFile.h"
#include "base/Numbers.h"

namespace morvik::tables {

namespace {

constexpr std::size_t headerSize = 128;  // numbers begin at a multiple of 64 bytes
constexpr char shapeKey[] = "'shape': (";

std::string npyFile(const std::string& folder, const Table& table)
{
    return folder + '/' + table.name + ".npy";
}

/// The header of format version 1.0, padded with blanks to its fixed size.
std::string npyHeader(const Table& table, std::uint64_t rows)
{
    const Storage storage = storageOf(table);
    const std::string order = storage.bits == 8 ? "|" : "<";
    std::string text = "{'descr': '" + order + (storage.isSigned ? 'i' : 'u') + std::to_string(storage.bits / 8) +
                       "', 'fortran_order': False, " + shapeKey + std::to_string(rows) + ',' +
                       (table.columns.size() > 1 ? ' ' + std::to_string(table.columns.size()) : "") + "), }";
    constexpr std::size_t prologue = 10;
    text.resize(headerSize - prologue, ' ');
    text.back() = '\n';
    std::string whole = "\x93NUMPY";
    whole += {1, 0, static_cast<char>(text.size()), 0};
    return whole + text;
}

class NpyWriter : public TableWriter {
public:
    NpyWriter(base::OutputFile file, Table table)
        : itsTable(std::move(table)), itsBytes(storageOf(itsTable).bits / 8), itsFile(std::move(file))
    {
        itsFile.write(npyHeader(itsTable, 0));
    }

    void add(std::uint32_t, const Row& row) override
    {
        itsPart.clear();
        for (const std::int64_t value : row) {
            for (unsigned byte = 0; byte < itsBytes; ++byte) {
                itsPart += static_cast<char>(static_cast<std::uint64_t>(value) >> 8 * byte & 0xFF);
            }
        }
        itsFile.write(itsPart);
        ++itsRows;
    }

    void finish() override
    {
        itsFile.overwriteStart(npyHeader(itsTable, itsRows));
        itsFile.commit();
    }

private:
    Table itsTable;
    unsigned itsBytes;
    base::OutputFile itsFile;
    std::string itsPart;
    std::uint64_t itsRows = 0;
};

class NpyReader : public TableReader {
public:
    NpyReader(const std::string& folder, Table table)
        : itsTable(std::move(table)),
          itsStorage(storageOf(itsTable)),
          itsName(npyFile(folder, itsTable)),
          itsFile(base::openFile(itsName)),
          itsPart(itsTable.columns.size() * itsStorage.bits / 8, '\0')
    {
        std::string found(headerSize, '\0');
        itsFile.read(found.data(), headerSize);
        const std::size_t key = found.find(shapeKey);
        std::string_view rest = std::string_view(found).substr(key == std::string::npos ? headerSize : key);
        const auto rows = base::take(rest, shapeKey) ? base::takeInteger(rest) : std::nullopt;
        if (!rows || found != npyHeader(itsTable, static_cast<std::uint64_t>(*rows))) {
            throw base::Error(itsName + ": is not the NumPy array that was written");
        }
        itsRows = static_cast<std::uint64_t>(*rows);
    }

    bool next(Row& row) override
    {
        if (itsRow == itsRows) {
            if (itsFile.peek() != std::ifstream::traits_type::eof()) {
                throw base::Error(itsName + ": has more numbers than its shape says");
            }
            return false;
        }
        if (!itsFile.read(itsPart.data(), static_cast<std::streamsize>(itsPart.size()))) {
            throw base::Error(itsName + ": ends before row " + std::to_string(itsRow));
        }
        ++itsRow;
        row.resize(itsTable.columns.size());
        for (std::size_t i = 0; i < row.size(); ++i) {
            row[i] = number(i);
        }
        checkFits(row, itsTable, *this);
        return true;
    }

    std::string place() const override
    {
        return itsName + ": row " + std::to_string(itsRow - 1);
    }

private:
    std::int64_t number(std::size_t i) const
    {
        const std::size_t bytes = itsStorage.bits / 8;
        std::int64_t value = 0;
        for (std::size_t byte = 0; byte < bytes; ++byte) {
            value |= std::int64_t{static_cast<unsigned char>(itsPart[i * bytes + byte])} << 8 * byte;
        }
        const std::int64_t range = std::int64_t{1} << itsStorage.bits;
        return itsStorage.isSigned && value >= range / 2 ? value - range : value;
    }

    Table itsTable;
    Storage itsStorage;
    std::string itsName;
    std::ifstream itsFile;
    std::string itsPart;
    std::uint64_t itsRows = 0;
    std::uint64_t itsRow = 0;  // rows read
};

}  // namespace

std::unique_ptr<TableWriter> npyWriter(base::OutputFile file, const Table& table)
{
    return std::make_unique<NpyWriter>(std::move(file), table);
}

const Format npyFormat = {"npy",
                          [](const Table& table) { return std::vector<std::string>{table.name + ".npy"}; },
                          [](const std::string& folder, const Table& table) -> std::unique_ptr<TableWriter> {
                              return npyWriter(base::OutputFile(npyFile(folder, table)), table);
                          },
                          [](const std::string& folder, const Table& table) -> std::unique_ptr<TableReader> {
                              return std::make_unique<NpyReader>(folder, table);
                          }};

}  // namespace morvik::tables

// Table: rows of integers in named columns, which every format writes and reads.
#ifndef MORVIK_HARDWARE_TABLES_TABLE_H
#define MORVIK_HARDWARE_TABLES_TABLE_H

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace morvik::tables {

/// Values of 1 to 32 bits; those with a sign are in two's complement.
struct Column {
    std::string name;
    unsigned bits = 0;
    bool isSigned = false;
};

struct Table {
    std::string name;  ///< letters, digits and underscores
    std::vector<Column> columns;
};

using Row = std::vector<std::int64_t>;

/// Writes the rows of a table to a file. Throws base::Error, prefixed with the file's name.
class TableWriter {
public:
    virtual ~TableWriter() = default;

    /// Adds a row of the block with number `block`. Each value must fit its column.
    virtual void add(std::uint32_t block, const Row& row) = 0;

    /// Writes the end. Nothing may be added after it.
    virtual void finish() = 0;
};

/// Reads the rows of a table. Throws base::Error, prefixed with the location.
class TableReader {
public:
    virtual ~TableReader() = default;

    /// Reads the next row; false at the end.
    virtual bool next(Row& row) = 0;

    /// The block of the row, if the format records it.
    virtual std::optional<std::int64_t> block() const
    {
        return std::nullopt;
    }

    /// The place of the row, for messages: FILE:LINE or FILE: row N.
    virtual std::string place() const = 0;
};

/// A file format of tables.
struct Format {
    std::string name;

    /// The files of a table, without their folder.
    std::vector<std::string> (*files)(const Table& table);

    std::unique_ptr<TableWriter> (*writer)(const std::string& folder, const Table& table);
    std::unique_ptr<TableReader> (*reader)(const std::string& folder, const Table& table);
};

/// memh, csv, npy and c.
const std::vector<Format>& formats();

/// The format of the name, or null.
const Format* findFormat(const std::string& name);

}  // namespace morvik::tables

#endif

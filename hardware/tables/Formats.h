// Formats: the file formats of tables.
#ifndef MORVIK_HARDWARE_TABLES_FORMATS_H
#define MORVIK_HARDWARE_TABLES_FORMATS_H

#include "Table.h"
#include "base/OutputFile.h"

namespace morvik::tables {

/// Words for $readmemh.
extern const Format memhFormat;

/// Comma-separated values, with the number of the block before each row.
extern const Format csvFormat;

/// An array of NumPy.
extern const Format npyFormat;

/// An array in C, with a header.
extern const Format cFormat;

/// Write a table to a file of any name. The one for csvWriter need not be seekable.
std::unique_ptr<TableWriter> csvWriter(base::OutputFile file, const Table& table);
std::unique_ptr<TableWriter> npyWriter(base::OutputFile file, const Table& table);

/// The machine integer that holds any value of the table.
struct Storage {
    unsigned bits = 8;  ///< 8, 16 or 32
    bool isSigned = false;
};

Storage storageOf(const Table& table);

/// Throws base::Error, prefixed with `place`, unless the value fits the column.
void checkFits(std::int64_t value, const Column& column, const std::string& place);

/// The same for each value of the reader's current row.
void checkFits(const Row& row, const Table& table, const TableReader& reader);

}  // namespace morvik::tables

#endif

// Formats: the file formats of tables.
#include "Formats.h"

#include "base/Error.h"

namespace morvik::tables {

const std::vector<Format>& formats()
{
    static const std::vector<Format> all = {memhFormat, csvFormat, npyFormat, cFormat};
    return all;
}

const Format* findFormat(const std::string& name)
{
    for (const Format& format : formats()) {
        if (format.name == name) {
            return &format;
        }
    }
    return nullptr;
}

Storage storageOf(const Table& table)
{
    Storage storage;
    for (const Column& column : table.columns) {
        storage.isSigned = storage.isSigned || column.isSigned;
    }
    for (const Column& column : table.columns) {
        // In a signed integer, unsigned values need one bit more.
        const unsigned bits = column.bits + (storage.isSigned && !column.isSigned ? 1 : 0);
        while (storage.bits < bits) {
            storage.bits *= 2;
        }
    }
    return storage;
}

void checkFits(std::int64_t value, const Column& column, const std::string& place)
{
    const std::int64_t range = std::int64_t{1} << column.bits;
    const std::int64_t lowest = column.isSigned ? -range / 2 : 0;
    if (value < lowest || value >= lowest + range) {
        throw base::Error(place + ": " + column.name + ' ' + std::to_string(value) + " is not allowed, expected " +
                          std::to_string(lowest) + " to " + std::to_string(lowest + range - 1));
    }
}

void checkFits(const Row& row, const Table& table, const TableReader& reader)
{
    const std::string place = reader.place();
    for (std::size_t i = 0; i < row.size(); ++i) {
        checkFits(row[i], table.columns[i], place);
    }
}

}  // namespace morvik::tables

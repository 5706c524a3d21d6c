// BlockFiles: the blocks of a set as tables, in one format.
//
//   blocks      a row for each block: K, iterations, tags, and where its rows begin in the other tables
//   stimulus    K + 4 rows for each block: the three soft values of a position
//   expected    K rows for each block: the decisions
//   ratios      K rows for each block: log-likelihood ratios in eighths
//   internal    K + 3 rows for each half-iteration of each block: values of the pass in eighths
#ifndef MORVIK_HARDWARE_VECTORS_BLOCKFILES_H
#define MORVIK_HARDWARE_VECTORS_BLOCKFILES_H

#include <cstdint>
#include <memory>
#include <set>
#include <string>
#include <vector>

#include "Block.h"
#include "Settings.h"
#include "hardware/tables/Formats.h"

namespace morvik::vectors {

/// A stored table and its number of rows.
struct KeptTable {
    tables::Table table;
    std::uint64_t rows = 0;
};

/// The tables of a set, and the index of each.
struct Layout {
    Layout(const tables::Format& format, const Settings& settings);

    std::vector<tables::Table> tables;
    bool streamsAreSeparate;  ///< the stimulus is three tables, one for each stream
    std::size_t blocks = 0;
    std::size_t stimulus = 1;  ///< the first of its tables
    std::size_t expected = 0;
    std::size_t ratios = 0;    ///< 0 if there are none
    std::size_t internal = 0;  ///< 0 if there are none
};

/// The table of values of passes: half-iteration, step, and each signal.
tables::Table internalTable();

/// The files of all tables that a set can have.
std::set<std::string> filesOfAllTables();

/// Writes blocks one by one.
class BlockWriter {
public:
    BlockWriter(const std::string& folder, const tables::Format& format, const Settings& settings);

    void add(const Stimulus& stimulus, const Expected& expected);
    void finish();

    /// The tables written so far.
    std::vector<KeptTable> tables() const;

private:
    void addRow(std::size_t table, const tables::Row& row);
    void addStimulus(const Stimulus& stimulus);

    Layout itsLayout;
    std::uint32_t itsIterations;
    std::vector<std::unique_ptr<tables::TableWriter>> itsWriters;
    std::vector<std::uint64_t> itsRows;
    std::uint32_t itsBlock = 0;
};

/// Reads blocks back. Throws base::Error, prefixed with the location.
class BlockReader {
public:
    BlockReader(const std::string& folder, const tables::Format& format, const Settings& settings);

    /// Reads the next block; false at the end, where no table may have rows left. The tables do not hold names.
    bool next(Stimulus& stimulus, Expected& expected);

    /// The rows read so far of each table.
    const std::vector<std::uint64_t>& rows() const
    {
        return itsRows;
    }

private:
    bool nextRow(std::size_t table);
    void readRow(std::size_t table);
    void expectFirst(std::size_t column, std::size_t table) const;
    void readStimulus(Stimulus& stimulus);
    void readExpected(Expected& expected, std::uint32_t K);
    void readInternal(Expected& expected, std::uint32_t K);
    void expectEnd();

    Layout itsLayout;
    std::uint32_t itsIterations;
    std::vector<std::unique_ptr<tables::TableReader>> itsReaders;
    std::vector<std::uint64_t> itsRows;
    std::int64_t itsBlock = -1;
    tables::Row itsRow;
};

}  // namespace morvik::vectors

#endif

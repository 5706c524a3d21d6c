// SoftValueReader: reads blocks of soft values from CSV.
#ifndef MORVIK_APP_SOFTVALUEREADER_H
#define MORVIK_APP_SOFTVALUEREADER_H

#include <cstddef>
#include <cstdint>
#include <istream>
#include <optional>
#include <string>
#include <string_view>

#include "base/Csv.h"
#include "base/Error.h"
#include "base/LineReader.h"
#include "hardware/testbench/SoftBlock.h"

namespace morvik {

/// The header line.
constexpr char softValueHeader[] = "block,rsc1_sys,rsc1_par,rsc2_par";

/// The allowed numbers of rows in a block, for messages.
constexpr char allowedRows[] = "K + 4 rows, where K is a block size of 3GPP TS 36.212 (40 to 6144)";

/// The label of a row's block, its first field: a non-negative integer of any length. Throws Error, naming the line, if
/// it is none.
std::string_view labelOf(const base::LineReader& lines, const base::CsvReader& row);

/// Reads one block at a time.
///
/// After the header, each row has four decimal integers: the label of its block, a non-negative integer of any length,
/// and three 32-bit soft values. A row whose label differs, as text, from the previous one starts a new block. Blank
/// lines are allowed only at the end. Throws Error, naming the line.
class SoftValueReader {
public:
    /// Reads the header. `input` must outlive the reader; messages call it `name`.
    SoftValueReader(std::istream& input, const std::string& name);

    /// Reads the next block; false at the end. Defers an error in the row after the block to the next call, so that the
    /// block is not lost: only a valid label tells that the row belongs to another.
    bool next(SoftBlock& block);

    /// Whether anything but blank lines follows this block.
    bool hasMore() const
    {
        return !itsAtEnd || itsMistake;
    }

    /// Throws an Error about the first line of this block, or the error that cut it short.
    [[noreturn]] void failBlock(const std::string& what) const;

private:
    /// Reads the next row and its label; an error ends the rows and is kept.
    void advance();
    void readLabel();
    void appendRow(SoftBlock& block) const;
    std::int32_t value(std::size_t column) const;

    base::LineReader itsLines;
    base::CsvReader itsRow{itsLines};
    bool itsAtEnd = false;
    std::optional<base::Error> itsMistake;
    std::string itsLabel;  // of the current row, not yet in a block
    std::size_t itsFirstLine = 0;
};

/// Reads block `number`, from 0, of a file; "-" is standard input. Throws an Error if there is none, or if its size is
/// not one of the standard's.
SoftBlock readBlock(const std::string& file, std::uint32_t number);

}  // namespace morvik

#endif

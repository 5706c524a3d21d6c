// SoftValueReader: blocks of soft values from CSV text.
#ifndef MORVIK_APP_SOFTVALUEREADER_H
#define MORVIK_APP_SOFTVALUEREADER_H

#include <cstddef>
#include <cstdint>
#include <istream>
#include <optional>
#include <string>

#include "base/Csv.h"
#include "base/Error.h"
#include "base/LineReader.h"
#include "hardware/testbench/SoftBlock.h"

namespace morvik {

/// The first line of the text.
constexpr char softValueHeader[] = "block,rsc1_sys,rsc1_par,rsc2_par";

/// How many rows a block may have, for messages.
constexpr char allowedRows[] = "K + 4 rows, K being one of the block sizes of 3GPP TS 36.212 (40 to 6144)";

/// Reads one block at a time.
///
/// After the header, each row has four decimal integers: the label of its block, a non-negative integer of any
/// length, and three soft values of 32 bits. A row whose label differs, as text, from that of the row before starts
/// a new block. Blank lines are allowed at the end only. Whatever is wrong is thrown as an Error naming the line.
class SoftValueReader {
public:
    /// Reads the header. `input` outlives the reader; `name` is what messages call it.
    SoftValueReader(std::istream& input, const std::string& name);

    /// Reads the next block; false at the end. A mistake in the row that follows the block is left to the next call,
    /// so that the block itself is not lost: only if that row has a label can one tell that it belongs to another.
    bool next(SoftBlock& block);

    /// Whether anything but blank lines follows the block just read.
    bool hasMore() const
    {
        return !itsAtEnd || itsMistake;
    }

    /// Throws an Error about the first line of the block just read, or about the mistake that cut it short.
    [[noreturn]] void failBlock(const std::string& what) const;

private:
    /// Goes to the next row and reads its label; a mistake ends the rows and is kept.
    void advance();
    void readLabel();
    void expectOnlyBlankLines();
    void appendRow(SoftBlock& block) const;
    std::int32_t value(std::size_t column) const;

    base::LineReader itsLines;
    base::CsvReader itsRow{itsLines};
    bool itsAtEnd = false;
    std::optional<base::Error> itsMistake;
    std::string itsLabel;  // of the current row, which no block has yet
    std::size_t itsFirstLine = 0;
};

/// The block of this number, from 0, in a file; "-" is the standard input. Throws an Error where there is none, or
/// where its size is not one of the standard's.
SoftBlock readBlock(const std::string& file, std::uint32_t number);

}  // namespace morvik

#endif

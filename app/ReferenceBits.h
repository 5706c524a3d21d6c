// ReferenceBits: the bits that were sent, from text with one line of 0 and 1 for each block.
#ifndef MORVIK_APP_REFERENCEBITS_H
#define MORVIK_APP_REFERENCEBITS_H

#include <cstddef>
#include <cstdint>
#include <istream>
#include <string>
#include <string_view>
#include <vector>

#include "base/LineReader.h"

namespace morvik {

/// Hands out the lines, or compares decisions with them, one after the other. What is wrong with a line is thrown as a
/// base::Error.
class ReferenceBits {
public:
    /// `input` outlives the reader; `name` is what messages call it.
    ReferenceBits(std::istream& input, const std::string& name);

    /// The bits of the next line, 0 or 1 each.
    std::vector<std::uint8_t> next();

    /// The number of decisions that differ from the next line.
    std::size_t countErrors(const std::vector<std::uint8_t>& decisions);

    /// Throws unless all lines have been compared; blank lines at the end do not count.
    void expectEnd();

    /// Throws an Error about the line that was read last.
    [[noreturn]] void fail(const std::string& what) const;

private:
    std::string_view nextLine();

    base::LineReader itsLines;
};

}  // namespace morvik

#endif

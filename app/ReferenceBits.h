// ReferenceBits: the bits that were sent, from text with one line of 0 and 1 for each block.
#ifndef MORVIK_REFERENCEBITS_H
#define MORVIK_REFERENCEBITS_H

#include <cstddef>
#include <cstdint>
#include <istream>
#include <string>
#include <vector>

#include "LineReader.h"

namespace morvik {

/// Compares decisions with the lines, one after the other. What is wrong with a line is thrown as a FileError.
class ReferenceBits {
public:
    /// `input` outlives the reader; `name` is what messages call it.
    ReferenceBits(std::istream& input, const std::string& name);

    /// The number of decisions that differ from the next line.
    std::size_t countErrors(const std::vector<std::uint8_t>& decisions);

    /// Throws unless all lines have been compared; blank lines at the end do not count.
    void expectEnd();

private:
    LineReader itsLines;
};

}  // namespace morvik

#endif

// ReferenceBits: reads the transmitted bits, one line of 0 and 1 per block.
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

/// Returns the lines in turn or compares decisions with them. Throws base::Error if a line is wrong.
class ReferenceBits {
public:
    /// `input` must outlive the reader; messages call it `name`. Lines have at most `longest` bits.
    ReferenceBits(std::istream& input, const std::string& name, std::size_t longest = base::LineReader::shortLines);

    /// The bits of the next line, each 0 or 1.
    std::vector<std::uint8_t> next();

    /// The number of decisions that differ from the next line.
    std::size_t countErrors(const std::vector<std::uint8_t>& decisions);

    /// Throws unless all lines have been compared; ignores blank lines at the end.
    void expectEnd();

    /// Throws an Error about the line read last.
    [[noreturn]] void fail(const std::string& what) const;

private:
    std::string_view nextLine();

    base::LineReader itsLines;
};

}  // namespace morvik

#endif

// BlockLayout: how the core processes a block of K bits, from the model's own components.
#ifndef MORVIK_APP_INFO_BLOCKLAYOUT_H
#define MORVIK_APP_INFO_BLOCKLAYOUT_H

#include <cstdint>
#include <string>
#include <vector>

#include "rules/Cut.h"

namespace morvik {

struct BlockLayout {
    std::uint32_t K = 0;
    std::uint32_t f1 = 0;
    std::uint32_t f2 = 0;
    std::vector<unsigned> interleaver;  ///< entry i is the index of the second encoder's i-th input bit
    std::vector<rules::Cut> cuts;       ///< for 2, 4 and 8 units
};

/// Throws std::invalid_argument unless K is a block size.
BlockLayout layoutOf(std::uint32_t K);

/// A fixed-point format of the core.
struct NumberFormat {
    std::string what;
    std::string text;  ///< as the components take it
    unsigned bits;
    unsigned fraction;
    double smallest;
    double largest;
};

std::vector<NumberFormat> numberFormats();

}  // namespace morvik

#endif

// AliasTable: draws one of 256 values in constant time, with exact probabilities (alias method of Walker and Vose).
#include "AliasTable.h"

#include <vector>

namespace morvik::link {

/// Every entry holds 2^40. An entry with less weight is filled up by one with more, its alias.
AliasTable::AliasTable(const Weights& weights)
{
    constexpr std::uint64_t room = std::uint64_t{1} << 40;
    static_assert(room * size == std::uint64_t{1} << weightBits);

    Weights left = weights;
    std::vector<unsigned> poor;
    std::vector<unsigned> rich;
    for (unsigned value = 0; value < size; ++value) {
        alias[value] = static_cast<std::uint8_t>(value);
        (left[value] < room ? poor : rich).push_back(value);
    }
    // The sums are exact: as long as there is an underfull entry, there is an overfull one. Full entries are their own
    // alias, so their threshold of 0 is harmless.
    while (!poor.empty()) {
        const unsigned taker = poor.back();
        const unsigned giver = rich.back();
        poor.pop_back();
        highThreshold[taker] = static_cast<std::uint8_t>(left[taker] >> 32);
        lowThreshold[taker] = static_cast<std::uint32_t>(left[taker] & 0xFFFFFFFF);
        alias[taker] = static_cast<std::uint8_t>(giver);
        left[giver] -= room - left[taker];
        if (left[giver] < room) {
            rich.pop_back();
            poor.push_back(giver);
        }
    }
}

}  // namespace morvik::link

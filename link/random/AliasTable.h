// AliasTable: draws one of 256 values in constant time, with exact probabilities (alias method of Walker and Vose).
#ifndef MORVIK_LINK_RANDOM_ALIASTABLE_H
#define MORVIK_LINK_RANDOM_ALIASTABLE_H

#include <array>
#include <cstdint>

namespace morvik::link {

/// Select an entry with 8 random bits. A uniform 40-bit number below the entry's threshold gives the entry's own index,
/// any other its alias. Its 8 highest bits nearly always decide.
struct AliasTable {
    static constexpr unsigned size = 256;

    /// A weight is a probability times 2^weightBits.
    static constexpr unsigned weightBits = 48;

    using Weights = std::array<std::uint64_t, size>;

    std::array<std::uint8_t, size> highThreshold{};  ///< the threshold's 8 highest bits
    std::array<std::uint32_t, size> lowThreshold{};  ///< the others
    std::array<std::uint8_t, size> alias{};

    /// The weights must sum to 2^weightBits.
    explicit AliasTable(const Weights& weights);

    std::uint64_t threshold(unsigned entry) const
    {
        return std::uint64_t{highThreshold[entry]} << 32 | lowThreshold[entry];
    }
};

}  // namespace morvik::link

#endif

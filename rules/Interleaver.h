// Interleaver: the order of a block in the second constituent code (rule 15 of docs/arithmetic.md).
#ifndef MORVIK_RULES_INTERLEAVER_H
#define MORVIK_RULES_INTERLEAVER_H

#include <cstdint>

#include "rules/BlockSizes.h"

namespace morvik::rules {

/// Generates the addresses Pi(i) = (f1 i + f2 i^2) mod K for i = 0, 1, ... K - 1: position i of the interleaved order
/// is position Pi(i) of the natural one (rule 15). Two adders suffice: Pi(i + 1) = Pi(i) + step(i) and step(i + 1) =
/// step(i) + 2 f2, both modulo K. Every sum is below 2 K.
class InterleaverAddress {
public:
    explicit constexpr InterleaverAddress(const BlockSize& size)
        : itsK(size.K), itsStep((size.f1 + size.f2) % size.K), itsIncrement(2 * size.f2 % size.K)
    {
    }

    /// Returns Pi(0) on the first call, then the next address on each call.
    constexpr std::uint32_t next()
    {
        const std::uint32_t position = itsPosition;
        itsPosition = sum(itsPosition, itsStep);
        itsStep = sum(itsStep, itsIncrement);
        return position;
    }

private:
    /// a + b modulo K.
    constexpr std::uint32_t sum(std::uint32_t a, std::uint32_t b) const
    {
        return a + b >= itsK ? a + b - itsK : a + b;
    }

    std::uint32_t itsK;
    std::uint32_t itsPosition = 0;
    std::uint32_t itsStep;
    std::uint32_t itsIncrement;
};

}  // namespace morvik::rules

#endif

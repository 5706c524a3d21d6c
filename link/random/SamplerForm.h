// SamplerForm: the implementations of drawing quantised values, one for each instruction set that has its own.
#ifndef MORVIK_LINK_RANDOM_SAMPLERFORM_H
#define MORVIK_LINK_RANDOM_SAMPLERFORM_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "AliasTable.h"
#include "Random.h"

namespace morvik::link {

/// Up to 64 soft values of one frame and stream, eight per random block, from consecutive blocks. Bytes 0 to 7 of a
/// block select the table entries of its values; bytes 8 to 15 are the 8 highest bits to compare with their thresholds.
struct ValueGroup {
    std::uint64_t counterLow;   ///< words 0 and 1 of the first random block's counter
    std::uint64_t counterHigh;  ///< words 2 and 3
    std::uint64_t bits;         ///< a value is negated where the bit is 0
    std::int8_t* values;        ///< destination
    std::uint32_t* clipped;     ///< where the caller counts its clipped values
    unsigned count;             ///< number of values

    // Left to the caller, one bit per value.
    std::uint64_t undecided;  ///< the 8 bits equal the threshold's: for now, the value is the entry's own
    std::uint64_t ends;       ///< the value was -128 or 127 before negation
};

/// The counters of noise: words 0 and 1 of the first random blocks of d and of u and v, and words 2 and 3 of all.
struct NoiseCounters {
    std::uint64_t coarseLow;
    std::uint64_t fineLow;
    std::uint64_t high;
};

/// Numbers of noise, 64 for each group: 256 d + u + v - 255. Eight of them have a random block of d, which is drawn as
/// the values of a ValueGroup are, and one of u and v, its bytes 0 to 7 and 8 to 15.
struct DrawnNoise {
    std::int16_t* numbers;
    std::int8_t* levels;       ///< d
    std::uint64_t* undecided;  ///< of each group, as above
};

/// One implementation of drawing in bulk.
struct SamplerForm {
    const char* name;

    /// Fills the values and the last two members of the groups.
    void (*draw)(const AliasTable& table, const RandomKey& key, ValueGroup* groups, std::size_t count);

    /// Replaces counters by their random blocks: words 0 and 1, and words 2 and 3.
    void (*randomBlocks)(const RandomKey& key, std::uint64_t* low, std::uint64_t* high, std::size_t count);

    /// Draws `groups` groups of noise from consecutive blocks.
    void (*noise)(const AliasTable& table,
                  const RandomKey& key,
                  const NoiseCounters& counters,
                  std::size_t groups,
                  const DrawnNoise& drawn);
};

/// The forms that this machine can run, the best one first. The last one, "generic", runs everywhere; all give the same
/// values.
std::vector<SamplerForm> samplerForms();

}  // namespace morvik::link

#endif

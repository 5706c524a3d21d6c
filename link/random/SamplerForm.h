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

/// One implementation of drawing in bulk.
struct SamplerForm {
    const char* name;

    /// Fills the values and the last two members of the groups.
    void (*draw)(const AliasTable& table, const RandomKey& key, ValueGroup* groups, std::size_t count);

    /// Replaces counters by their random blocks: words 0 and 1, and words 2 and 3.
    void (*randomBlocks)(const RandomKey& key, std::uint64_t* low, std::uint64_t* high, std::size_t count);
};

/// The forms that this machine can run, the best one first. The last one, "generic", runs everywhere; all give the same
/// values.
std::vector<SamplerForm> samplerForms();

}  // namespace morvik::link

#endif

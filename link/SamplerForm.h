// SamplerForm: the ways to draw quantised values, one for each instruction set that has its own.
#ifndef MORVIK_LINK_SAMPLERFORM_H
#define MORVIK_LINK_SAMPLERFORM_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "AliasTable.h"
#include "Random.h"

namespace morvik::link {

/// Up to 64 soft values of one frame and stream, eight for each of consecutive random blocks. Bytes 0 to 7 of a block
/// choose the entries of its values, bytes 8 to 15 are the 8 highest bits of what is compared with their thresholds.
struct ValueGroup {
    std::uint64_t counterLow;   ///< words 0 and 1 of the first random block's counter
    std::uint64_t counterHigh;  ///< words 2 and 3
    std::uint64_t bits;         ///< a value is negated where the bit is 0
    std::int8_t* values;        ///< where they go
    std::uint32_t* clipped;     ///< for the caller: where its clipped values are counted
    unsigned count;             ///< how many there are

    // What the form leaves to the caller, a bit for each value.
    std::uint64_t undecided;  ///< the 8 bits equal the threshold's: the value is the entry's own, for the time being
    std::uint64_t ends;       ///< before it was negated, the value was -128 or 127
};

/// A way to draw in bulk.
struct SamplerForm {
    const char* name;

    /// Fills the values and the two last members of groups.
    void (*draw)(const AliasTable& table, const RandomKey& key, ValueGroup* groups, std::size_t count);

    /// Puts random blocks in the place of their counters: words 0 and 1, and words 2 and 3.
    void (*randomBlocks)(const RandomKey& key, std::uint64_t* low, std::uint64_t* high, std::size_t count);
};

/// Those that this machine can run, the best one first. The last one, "generic", runs everywhere; all give the same.
std::vector<SamplerForm> samplerForms();

}  // namespace morvik::link

#endif

// SamplerForm: the ways to draw quantised values for 64 bits at a time, one for each instruction set that has its own.
#ifndef MORVIK_LINK_SAMPLERFORM_H
#define MORVIK_LINK_SAMPLERFORM_H

#include <cstdint>
#include <vector>

#include "AliasTable.h"
#include "Random.h"

namespace morvik::link {

/// What a form works on: `count` soft values, eight for each random block from `index` on. Bytes 0 to 7 of a block
/// choose the entries of its values, bytes 8 to 15 are the 8 highest bits of what is compared with their thresholds.
struct Draws {
    const AliasTable* table;
    const FrameKey* frame;
    std::uint32_t index;
    unsigned count;
    const std::uint64_t* bits;  ///< 64 to a word: a value is negated where the bit is 0

    std::int8_t* values;

    // One bit for each value, 64 to a word. Bits behind `count` are 0.
    std::uint64_t* undecided;  ///< the 8 bits equal the threshold's: the value is the entry's own, for the time being
    std::uint64_t* ends;       ///< before it was negated, the value was -128 or 127
};

struct SamplerForm {
    const char* name;
    void (*draw)(const Draws& draws);
};

/// Those that this machine can run, the best one first. The last one, "generic", runs everywhere; all give the same.
std::vector<SamplerForm> samplerForms();

}  // namespace morvik::link

#endif

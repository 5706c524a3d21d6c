// Blocks: the stimuli of a set, random and directed.
#ifndef MORVIK_HARDWARE_VECTORS_BLOCKS_H
#define MORVIK_HARDWARE_VECTORS_BLOCKS_H

#include <cstdint>
#include <functional>
#include <vector>

#include "Block.h"
#include "Settings.h"

namespace morvik::vectors {

/// The name of random blocks.
constexpr char randomName[] = "random";

/// Hands each stimulus on, one after the other: the random blocks of each size, then the directed ones.
void forEachStimulus(const Settings& settings, const std::function<void(const Stimulus&)>& take);

/// The sizes at which the core with so many processing units cuts a block in another way than the size before, both of
/// them, as long as a segment has up to three windows; and the smallest and the largest of all sizes.
std::vector<unsigned> edgeSizes(unsigned units);

/// The tags 0 and 1, the largest that the width carries, those just above, and all ones.
std::vector<std::uint32_t> edgeTags(unsigned width);

}  // namespace morvik::vectors

#endif

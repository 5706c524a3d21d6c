// Blocks: the stimuli of a set, random and directed.
#ifndef MORVIK_HARDWARE_VECTORS_BLOCKS_H
#define MORVIK_HARDWARE_VECTORS_BLOCKS_H

#include <cstdint>
#include <functional>
#include <vector>

#include "Block.h"
#include "Settings.h"

namespace morvik::vectors {

/// The name of plain random blocks.
constexpr char randomName[] = "random";

/// The sizes of a set's random blocks: those of its transport blocks' code blocks, if it has any.
std::vector<unsigned> sizesOf(const Settings& settings);

/// Calls `take` with each stimulus: the random blocks of each size or format, then the directed ones.
void forEachStimulus(const Settings& settings, const std::function<void(const Stimulus&)>& take);

/// The sizes before and after each change in how a core with `units` processing units cuts blocks, for segments of up
/// to three windows; and the smallest and the largest of all sizes.
std::vector<unsigned> edgeSizes(unsigned units);

/// The tags 0 and 1, the largest of `width` bits, those just above, and all ones.
std::vector<std::uint32_t> edgeTags(unsigned width);

}  // namespace morvik::vectors

#endif

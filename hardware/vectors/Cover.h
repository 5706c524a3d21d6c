// Cover: random blocks that meet situations of the arithmetic which a set lacks.
#ifndef MORVIK_HARDWARE_VECTORS_COVER_H
#define MORVIK_HARDWARE_VECTORS_COVER_H

#include <cstdint>
#include <functional>
#include <vector>

#include "Block.h"
#include "Core.h"
#include "Settings.h"
#include "hardware/coverage/Counts.h"

namespace morvik::vectors {

/// The name of these blocks.
constexpr char coverName[] = "cover";

/// The situations that the settings name, and the core can meet but has not met yet.
std::vector<unsigned> uncovered(const Settings& settings, const coverage::Counts& counts);

/// The sizes of the blocks that are drawn: those of the settings; without any, edgeSizes().
std::vector<unsigned> coverSizes(const Settings& settings);

/// Block `number` of those that are drawn: of each size in turn, one of each kind: uniform, extreme and small values,
/// code words in much, in little and without noise. A block follows from settings and number.
Stimulus drawn(const Settings& settings, std::uint64_t number);

/// Draws up to Settings::coverLimit blocks while situations are uncovered; calls `keep` with each block that meets one,
/// and adds what it meets to the counts.
void cover(const Settings& settings,
           Core& core,
           coverage::Counts& counts,
           const std::function<void(const Stimulus&)>& keep);

}  // namespace morvik::vectors

#endif

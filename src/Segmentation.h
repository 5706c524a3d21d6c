// Segmentation: how a block is cut into segments, and a segment into windows.
#ifndef MORVIK_SRC_SEGMENTATION_H
#define MORVIK_SRC_SEGMENTATION_H

#include <cstdint>
#include <vector>

namespace segmentation {

/// The number of segments doubles until every thread has one or they would become shorter than 64 steps
/// (rule 17).
std::uint32_t segmentCount(std::uint32_t K, std::uint64_t threads);

/// The first step of each window of a segment of `length` steps, counted from its start, and its end
/// (rule 18).
std::vector<std::uint32_t> windowStarts(std::uint32_t length);

}  // namespace segmentation

#endif

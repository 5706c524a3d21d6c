// Segmentation: how a block is cut into segments, and a segment into windows.
#include "Segmentation.h"

namespace segmentation {

namespace {

/// The steps of the next window when `rest` steps of the segment remain: 64, and the last 65 to 127
/// in two halves, the longer first.
std::uint32_t windowLength(std::uint32_t rest)
{
    if (rest >= 128) {
        return 64;
    }
    return rest > 64 ? (rest + 1) / 2 : rest;
}

}  // namespace

std::uint32_t segmentCount(std::uint32_t K, std::uint64_t threads)
{
    std::uint64_t count = 1;
    if (threads >= 2 && K >= 128) {
        do {
            count *= 2;
        } while (count < threads && 128 * count <= K);
    }
    return static_cast<std::uint32_t>(count);
}

std::vector<std::uint32_t> windowStarts(std::uint32_t length)
{
    std::vector<std::uint32_t> starts = {0};
    while (starts.back() < length) {
        starts.push_back(starts.back() + windowLength(length - starts.back()));
    }
    return starts;
}

}  // namespace segmentation

// Possible: plausibility checks of counts read from files.
#include "Possible.h"

#include <algorithm>
#include <functional>
#include <vector>

#include "rules/Tail.h"

namespace morvik::simulation {

namespace {

std::string cannotBe(const char* column, std::uint64_t number, const std::string& of)
{
    return std::string(column) + ' ' + std::to_string(number) + " cannot be, of " + of;
}

/// Whether these can be the first failing frames, of `blockErrors` in all.
bool areFailures(const std::vector<std::uint64_t>& failures, const FrameSet& frames, std::uint64_t blockErrors)
{
    return failures.size() == std::min<std::uint64_t>(blockErrors, ErrorCounts::keptFailures) &&
           std::all_of(failures.begin(), failures.end(), [&](std::uint64_t frame) { return frames.has(frame); }) &&
           std::adjacent_find(failures.begin(), failures.end(), std::greater_equal<>()) == failures.end();
}

}  // namespace

std::optional<std::string> impossibleCount(const FrameSet& frames,
                                           unsigned K,
                                           const ErrorCounts& errors,
                                           std::uint64_t clipped)
{
    const std::uint64_t blocks = frames.size();
    if (blocks > mostBlocks) {
        return cannotBe("blocks", blocks, std::to_string(mostBlocks) + " at most");
    }
    const std::string wrongBlocks =
        std::to_string(errors.blockErrors) + " wrong blocks of " + std::to_string(K) + " bits";
    if (errors.blockErrors > blocks) {
        return cannotBe("block_errors", errors.blockErrors, std::to_string(blocks) + " blocks");
    }
    if (errors.bitErrors < errors.blockErrors || errors.bitErrors > errors.blockErrors * K) {
        return cannotBe("bit_errors", errors.bitErrors, wrongBlocks);
    }
    // A square is odd if its number is, so the two sums have the same parity.
    if (errors.bitErrorSquares < errors.bitErrors || errors.bitErrorSquares / K > errors.bitErrors ||
        errors.bitErrorSquares % 2 != errors.bitErrors % 2) {
        return cannotBe("bit_error_squares", errors.bitErrorSquares, std::to_string(errors.bitErrors) + " wrong bits");
    }
    if (clipped > std::uint64_t{3} * (K + rules::tailPositions) * blocks) {
        return cannotBe(
            "clipped_values", clipped, std::to_string(blocks) + " blocks of " + std::to_string(K) + " bits");
    }
    if (!areFailures(errors.failures, frames, errors.blockErrors)) {
        return "failed_frames cannot be the first of " + wrongBlocks + " in these frames";
    }
    return std::nullopt;
}

bool isPossibleTime(double seconds)
{
    constexpr double longest = 1e12;  // even for several runs together
    return seconds >= 0 && seconds <= longest;
}

}  // namespace morvik::simulation

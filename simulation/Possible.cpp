// Possible: plausibility checks of counts read from files.
#include "Possible.h"

#include <algorithm>
#include <functional>
#include <vector>

#include "base/Text.h"

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

/// Whether a count is above `most` times `each`, whose product may not fit in 64 bits.
bool isMoreThan(std::uint64_t count, std::uint64_t most, std::uint64_t each)
{
    return count > 0 && (count - 1) / each >= most;
}

/// Checks what was counted of transport blocks.
std::optional<std::string> impossibleReception(std::uint64_t blocks, const Point& point, const ErrorCounts& errors)
{
    const Reception& reception = errors.reception;
    const std::uint64_t codeBlocks = codeBlocksOf(point);
    const std::string ofBlocks = base::counted(blocks, "block") + " of " + base::counted(codeBlocks, "code block");
    if (reception.transmissions < blocks || isMoreThan(reception.transmissions, blocks, point.link.versions.size())) {
        return cannotBe("sent_transmissions", reception.transmissions, ofBlocks);
    }
    const std::uint64_t decodings = reception.transmissions * codeBlocks;
    const std::uint64_t least = point.link.stopsEarly ? 1 : point.iterations;
    if (reception.iterations / least < decodings || isMoreThan(reception.iterations, decodings, point.iterations)) {
        return cannotBe("run_iterations", reception.iterations, base::counted(decodings, "decoded code block"));
    }
    if (reception.codeBlockErrors < errors.blockErrors ||
        isMoreThan(reception.codeBlockErrors, errors.blockErrors, codeBlocks)) {
        return cannotBe(
            "code_block_errors",
            reception.codeBlockErrors,
            base::counted(errors.blockErrors, "wrong block") + " of " + base::counted(codeBlocks, "code block"));
    }
    if (reception.undetected > errors.blockErrors) {
        return cannotBe("undetected_errors", reception.undetected, base::counted(errors.blockErrors, "wrong block"));
    }
    return std::nullopt;
}

}  // namespace

std::optional<std::string> impossibleCount(const FrameSet& frames,
                                           const Point& point,
                                           const ErrorCounts& errors,
                                           std::uint64_t clipped)
{
    const std::uint64_t blocks = frames.size();
    const std::uint64_t K = countedBitsOf(point);
    if (blocks > mostBlocks) {
        return cannotBe("blocks", blocks, std::to_string(mostBlocks) + " at most");
    }
    const std::string wrongBlocks =
        base::counted(errors.blockErrors, "wrong block") + " of " + std::to_string(K) + " bits";
    if (errors.blockErrors > blocks) {
        return cannotBe("block_errors", errors.blockErrors, base::counted(blocks, "block"));
    }
    if (errors.bitErrors < errors.blockErrors || isMoreThan(errors.bitErrors, errors.blockErrors, K)) {
        return cannotBe("bit_errors", errors.bitErrors, wrongBlocks);
    }
    // A square is odd if its number is, so the two sums have the same parity.
    if (errors.bitErrorSquares < errors.bitErrors || errors.bitErrorSquares / K > errors.bitErrors ||
        errors.bitErrorSquares % 2 != errors.bitErrors % 2) {
        return cannotBe("bit_error_squares", errors.bitErrorSquares, base::counted(errors.bitErrors, "wrong bit"));
    }
    if (point.link.hasTransportBlocks()) {
        if (auto impossible = impossibleReception(blocks, point, errors)) {
            return impossible;
        }
    }
    const std::uint64_t received = point.link.hasTransportBlocks() ? errors.reception.transmissions : blocks;
    if (isMoreThan(clipped, received, softValuesOf(point))) {
        return cannotBe(
            "clipped_values", clipped, base::counted(blocks, "block") + " of " + std::to_string(K) + " bits");
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

// Tally: the counts of a point.
#ifndef MORVIK_SIMULATION_TALLY_H
#define MORVIK_SIMULATION_TALLY_H

#include <cstddef>
#include <cstdint>
#include <vector>

namespace morvik::simulation {

/// The cost of a transport block at one iteration count, and its remaining errors; or the sums of several blocks.
struct Reception {
    std::uint64_t codeBlockErrors = 0;  // code blocks with a wrong bit after the last transmission
    std::uint64_t undetected = 0;       // transport blocks with a wrong bit whose CRCs all fit
    std::uint64_t transmissions = 0;
    std::uint64_t iterations = 0;  // full iterations of all code blocks and transmissions

    void add(const Reception& other)
    {
        codeBlockErrors += other.codeBlockErrors;
        undetected += other.undetected;
        transmissions += other.transmissions;
        iterations += other.iterations;
    }
};

bool operator==(const Reception& a, const Reception& b);

/// The bit and block errors of any number of frames, at one iteration count.
struct ErrorCounts {
    /// The most failing frames that are recorded.
    static constexpr std::size_t keptFailures = 10;

    std::uint64_t bitErrors = 0;
    std::uint64_t blockErrors = 0;        // frames with a bit error
    std::uint64_t bitErrorSquares = 0;    // sum of the squares of each frame's bit errors, for their variance
    std::vector<std::uint64_t> failures;  // numbers of the first failing frames, ascending
    Reception reception;                  // zeros for plain code blocks

    /// Counts a frame with `wrongBits` wrong bits. Frames must come in the order of their numbers.
    void add(std::uint64_t frame, std::uint32_t wrongBits);

    /// Adds the counts of other frames.
    void add(const ErrorCounts& other);
};

/// The counts of a point.
struct Tally {
    std::uint64_t blocks = 0;
    std::uint64_t clipped = 0;        // clipped soft values
    std::vector<ErrorCounts> errors;  // for each iteration count; the point's own is last

    /// Starts empty, for `counts` iteration counts.
    explicit Tally(std::size_t counts = 1) : errors(counts) {}
};

}  // namespace morvik::simulation

#endif

// Tally: what is counted at a point.
#ifndef MORVIK_SIMULATION_TALLY_H
#define MORVIK_SIMULATION_TALLY_H

#include <cstddef>
#include <cstdint>
#include <vector>

namespace morvik::simulation {

/// The wrong decisions of any number of frames, at one count of iterations.
struct ErrorCounts {
    /// How many failing frames are remembered.
    static constexpr std::size_t keptFailures = 10;

    std::uint64_t bitErrors = 0;
    std::uint64_t blockErrors = 0;        // frames with a bit error
    std::uint64_t bitErrorSquares = 0;    // sum of the squares of each frame's bit errors: how unevenly they fall
    std::vector<std::uint64_t> failures;  // numbers of the first failing frames, ascending

    /// Counts a frame with that many wrong bits. Frames come in the order of their numbers.
    void add(std::uint64_t frame, std::uint32_t wrongBits);

    /// Counts what another has counted, of any other frames.
    void add(const ErrorCounts& other);
};

/// What is counted at a point.
struct Tally {
    std::uint64_t blocks = 0;
    std::uint64_t clipped = 0;  // soft values that were clipped
    std::vector<ErrorCounts>
        errors;  // after each count of iterations that is looked at, the last one being the point's

    /// Nothing yet, with room for so many counts of iterations.
    explicit Tally(std::size_t counts = 1) : errors(counts) {}
};

}  // namespace morvik::simulation

#endif

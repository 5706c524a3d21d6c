// Workers: the interface to what simulates the frames of a run.
#ifndef MORVIK_SIMULATION_WORKERS_H
#define MORVIK_SIMULATION_WORKERS_H

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "Tally.h"

namespace morvik::simulation {

/// Consecutive frames of a point of the plan.
struct FrameBatch {
    std::size_t point = 0;  // its number
    std::uint64_t first = 0;
    std::uint32_t count = 0;
};

/// The result of a batch.
struct BatchResult {
    FrameBatch batch;
    std::vector<std::uint32_t> wrongBits;  // of each frame, for each iteration count
    std::vector<std::uint32_t> clipped;    // clipped soft values of each frame
    std::vector<Reception> receptions;     // as wrongBits; none of plain code blocks
};

/// Simulates batches and returns their results, in any order. All workers know the plan.
class Workers {
public:
    Workers() = default;
    Workers(const Workers&) = delete;
    Workers& operator=(const Workers&) = delete;
    virtual ~Workers() = default;

    /// How many batches run in parallel.
    virtual unsigned count() const = 0;

    /// Hands out a batch. Does not block.
    virtual void handOut(const FrameBatch& batch) = 0;

    /// Waits for the next result, at most `patience`; nothing if none comes. Rethrows a worker's exception.
    virtual std::optional<BatchResult> take(std::chrono::milliseconds patience) = 0;

    /// Drops all batches handed out so far: take() returns none of their results.
    virtual void forgetAll() = 0;
};

}  // namespace morvik::simulation

#endif

// Workers: whoever simulates frames for a run.
#ifndef MORVIK_SIMULATION_WORKERS_H
#define MORVIK_SIMULATION_WORKERS_H

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

namespace morvik::simulation {

/// Neighbouring frames of a point of the plan.
struct FrameBatch {
    std::size_t point = 0;  // its number
    std::uint64_t first = 0;
    std::uint32_t count = 0;
};

/// Batches of a run have at least so many frames, if there are as many: what the encoder takes at a time.
constexpr std::uint32_t smallestBatch = 64;

/// What came of a batch.
struct BatchResult {
    FrameBatch batch;
    std::vector<std::uint32_t> wrongBits;  // of each frame, after each count of iterations that is looked at
    std::vector<std::uint32_t> clipped;    // of each frame, how many soft values were clipped
};

/// Takes batches and gives their results back, in any order. All workers know the plan.
class Workers {
public:
    Workers() = default;
    Workers(const Workers&) = delete;
    Workers& operator=(const Workers&) = delete;
    virtual ~Workers() = default;

    /// How many batches are worked on at the same time.
    virtual unsigned count() const = 0;

    /// Hands out a batch. Does not wait.
    virtual void handOut(const FrameBatch& batch) = 0;

    /// The next result; nothing if none comes within the time. Throws what a worker has thrown.
    virtual std::optional<BatchResult> take(std::chrono::milliseconds patience) = 0;

    /// Forgets all batches handed out so far: take() gives none of their results any more.
    virtual void forgetAll() = 0;
};

}  // namespace morvik::simulation

#endif

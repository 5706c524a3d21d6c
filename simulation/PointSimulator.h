// PointSimulator: the interface to what simulates the frames of one point.
#ifndef MORVIK_SIMULATION_POINTSIMULATOR_H
#define MORVIK_SIMULATION_POINTSIMULATOR_H

#include <cstdint>
#include <vector>

#include "Core.h"
#include "Workers.h"

namespace morvik::simulation {

/// A code block as the decoder last received it.
struct ReceivedBlock {
    Streams streams;
    std::vector<std::uint8_t> sent;  // K bits
};

/// Makes and decodes the frames of a point. Belongs to one thread.
class PointSimulator {
public:
    PointSimulator() = default;
    PointSimulator(const PointSimulator&) = delete;
    PointSimulator& operator=(const PointSimulator&) = delete;
    virtual ~PointSimulator() = default;

    /// How many frames are best simulated at once: few enough that their soft values and bits stay in the L2 cache, and
    /// at least as many as the encoder and the decoder take at once.
    virtual std::uint32_t framesAtOnce() const = 0;

    /// Simulates frames first to first + count - 1 and appends their results.
    virtual void simulate(std::uint64_t first, std::uint32_t count, BatchResult& result) = 0;

    /// The code blocks of the first of the frames that were simulated last.
    virtual std::vector<ReceivedBlock> receivedBlocks() const = 0;

protected:
    /// Blocks of K bits that are best decoded at once.
    static constexpr std::uint32_t blocksAtOnce(unsigned K)
    {
        return (K < 1024 ? 1024 / K : 1) * 64;
    }
};

}  // namespace morvik::simulation

#endif

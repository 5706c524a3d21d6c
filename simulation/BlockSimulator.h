// BlockSimulator: makes and decodes plain code blocks and counts their wrong bits.
#ifndef MORVIK_SIMULATION_BLOCKSIMULATOR_H
#define MORVIK_SIMULATION_BLOCKSIMULATOR_H

#include <variant>

#include "Plan.h"
#include "PointSimulator.h"
#include "link/FrameSource.h"
#include "link/ModulatedSource.h"

namespace morvik::simulation {

class BlockSimulator : public PointSimulator {
public:
    /// Plan, point and core must outlive the simulator.
    BlockSimulator(const Plan& plan, const Point& point, Core& core);

    std::uint32_t framesAtOnce() const override;
    void simulate(std::uint64_t first, std::uint32_t count, BatchResult& result) override;
    std::vector<ReceivedBlock> receivedBlocks() const override;

private:
    using Source = std::variant<link::FrameSource, link::ModulatedSource>;

    static Source sourceOf(const Plan& plan, const Point& point);
    void countWrongBits(std::uint32_t count, std::uint32_t* wrongBits);

    const Plan& itsPlan;
    const Point& itsPoint;
    Core& itsCore;
    Source itsSource;
    link::Frames itsFrames;
    std::vector<std::uint8_t> itsDecided;
};

}  // namespace morvik::simulation

#endif

// TransportSimulator: makes, decodes and checks transport blocks, with retransmissions.
#ifndef MORVIK_SIMULATION_TRANSPORTSIMULATOR_H
#define MORVIK_SIMULATION_TRANSPORTSIMULATOR_H

#include <array>

#include "Plan.h"
#include "PointSimulator.h"
#include "TransportCheck.h"
#include "link/TransportSource.h"

namespace morvik::simulation {

/// How a point sends and receives its transport blocks.
link::TransportSetting transportSettingOf(const Point& point);

class TransportSimulator : public PointSimulator {
public:
    /// Plan, point and core must outlive the simulator.
    TransportSimulator(const Plan& plan, const Point& point, Core& core, const std::string& instructionSet);

    std::uint32_t framesAtOnce() const override;
    void simulate(std::uint64_t first, std::uint32_t count, BatchResult& result) override;
    std::vector<ReceivedBlock> receivedBlocks() const override;

private:
    /// What is known of a frame. All but the sums of `reception` is of its last transmission.
    struct Frame {
        std::uint32_t wrongBits = 0;
        Reception reception;
        bool fits = false;                                  // every CRC
        std::vector<TransportCheck::Decisions> undetected;  // on code blocks that are wrong, but whose CRC fits
    };

    void transmit(const std::vector<unsigned>& frames, unsigned transmission, std::vector<std::uint32_t>& clipped);
    void decode(const std::vector<unsigned>& frames, unsigned iterations);
    void decodeEachIteration(const std::vector<unsigned>& frames, BatchResult& result);
    Core& coreOf(const link::CodeBlockBatch& batch);
    void decodeBatch(const link::CodeBlockBatch& batch, unsigned iterations);
    void decodeUntilItFits(const link::CodeBlockBatch& batch, unsigned iterations);
    bool judge(const link::CodeBlockBatch::Place& place, const std::uint8_t* decided, unsigned iterations, bool isLast);
    void append(BatchResult& result) const;

    const Plan& itsPlan;
    const Point& itsPoint;
    Core& itsCore;
    Core itsSmallCore;  // for the smaller size, as a core prepares for a size anew whenever that changes
    link::TransportSource itsSource;
    TransportCheck itsCheck;
    std::array<link::CodeBlockBatch, 2> itsBatches;
    link::CodeBlockBatch itsOpen;  // code blocks whose CRC has not fitted yet
    std::vector<Frame> itsFrames;
    std::vector<std::uint8_t> itsDecided;
};

}  // namespace morvik::simulation

#endif

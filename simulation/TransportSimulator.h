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
    /// The state of a frame after its last transmission; `reception` sums all transmissions.
    struct Frame {
        std::uint32_t wrongBits = 0;
        Reception reception;
        bool fits = false;                                  // every CRC
        std::vector<TransportCheck::Decisions> undetected;  // on code blocks that are wrong, but whose CRC fits
    };

    /// The decisions on a code block after an iteration.
    struct Judgement {
        BlockVerdict verdict;
        std::vector<std::uint8_t> undetected;  // the decisions, if they are wrong, but the CRC fits
    };

    void transmit(const std::vector<unsigned>& frames, unsigned transmission, std::vector<std::uint32_t>& clipped);
    void begin(const std::vector<unsigned>& frames);
    void decode(const std::vector<unsigned>& frames);
    void conclude(const std::vector<unsigned>& frames);
    void decodeEachIteration(const std::vector<unsigned>& frames, BatchResult& result);
    void judgeEachIteration(const link::CodeBlockBatch& batch, std::vector<Judgement>& judgements);
    void judgeAnew(const link::CodeBlockBatch& batch, unsigned iterations, std::vector<Judgement>& judgements);
    void countAfter(unsigned iterations, const link::CodeBlockBatch& batch, const std::vector<Judgement>& judgements);
    Core& coreOf(const link::CodeBlockBatch& batch);
    void decodeBatch(const link::CodeBlockBatch& batch);
    void decodeUntilItFits(const link::CodeBlockBatch& batch);
    Judgement judged(const link::CodeBlockBatch::Place& place, const std::uint8_t* decided);
    void count(const link::CodeBlockBatch::Place& place, const Judgement& judgement, unsigned iterations);
    void append(BatchResult& result) const;

    const Plan& itsPlan;
    const Point& itsPoint;
    Core& itsCore;
    Core itsSmallCore;  // for the smaller size: a core prepares anew whenever the size changes
    link::TransportSource itsSource;
    TransportCheck itsCheck;
    std::array<link::CodeBlockBatch, 2> itsBatches;
    link::CodeBlockBatch itsOpen;  // code blocks whose CRC has not fitted yet
    std::vector<Frame> itsFrames;
    std::vector<std::uint8_t> itsDecided;

    // If errors are counted after each iteration: of each code block of a batch, those after each.
    std::array<std::vector<Judgement>, 2> itsJudgements;
    std::vector<std::uint8_t> itsSent;
    std::vector<std::uint32_t> itsWrongBits;
    std::vector<std::size_t> itsAnew;  // code blocks that are decoded anew
};

}  // namespace morvik::simulation

#endif

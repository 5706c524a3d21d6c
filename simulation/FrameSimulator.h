// FrameSimulator: makes and decodes frames and counts their wrong bits, in one thread.
#ifndef MORVIK_SIMULATION_FRAMESIMULATOR_H
#define MORVIK_SIMULATION_FRAMESIMULATOR_H

#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "Core.h"
#include "Plan.h"
#include "PointSimulator.h"
#include "Workers.h"

namespace morvik::simulation {

/// Simulates the frames of a plan's points. Belongs to one thread.
class FrameSimulator {
public:
    /// `plan` must outlive the simulator. An empty instruction set leaves the choice to the decoder; all give the same
    /// bits.
    FrameSimulator(const Plan& plan, std::string instructionSet);

    /// An empty result for the batch.
    BatchResult begin(const FrameBatch& batch) const;

    /// Simulates the next frames of the batch, as many as decode best at once, and adds them to the result. Returns
    /// false if none are left.
    bool proceed(BatchResult& result);

    /// The code blocks of the first of the frames that were simulated last.
    std::vector<ReceivedBlock> receivedBlocks() const;

private:
    void prepareFor(std::size_t point);

    const Plan& itsPlan;
    std::string itsInstructionSet;
    std::optional<std::size_t> itsPoint;
    std::optional<Core> itsCore;
    std::unique_ptr<PointSimulator> itsSimulator;
};

}  // namespace morvik::simulation

#endif

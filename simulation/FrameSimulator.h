// FrameSimulator: makes and decodes frames and counts their wrong bits, in one thread.
#ifndef MORVIK_SIMULATION_FRAMESIMULATOR_H
#define MORVIK_SIMULATION_FRAMESIMULATOR_H

#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "Plan.h"
#include "Workers.h"
#include "link/FrameSource.h"
#include "morvik_v1_0_batch.h"

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

    /// The frames simulated last.
    const morvik::link::Frames& frames() const;

private:
    struct DestroyState {
        void operator()(veltra_ip_morvik_v1_0_state* state) const
        {
            veltra_ip_morvik_v1_0_destroy_state(state);
        }
    };

    void prepareFor(std::size_t point);
    void makeDecoder(const Point& point);
    void countWrongBits(const Point& point, std::uint32_t count, std::uint32_t* wrongBits);
    void countWrongBitsOfEachIteration(const Point& point, std::uint32_t count, std::uint32_t* wrongBits);

    const Plan& itsPlan;
    std::string itsInstructionSet;
    std::optional<std::size_t> itsPoint;
    std::unique_ptr<veltra_ip_morvik_v1_0_state, DestroyState> itsDecoder;
    std::optional<morvik::link::FrameSource> itsSource;
    morvik::link::Frames itsFrames;
    std::vector<std::uint8_t> itsDecided;
};

}  // namespace morvik::simulation

#endif

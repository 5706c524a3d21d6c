// Replay: reproduces one frame of a run for inspection.
#include "Replay.h"

#include "FrameSimulator.h"

namespace morvik::simulation {

ReplayedTexts replay(const Plan& plan, std::size_t point, std::uint64_t frame, const std::string& instructionSet)
{
    FrameSimulator simulator(plan, instructionSet);
    BatchResult result = simulator.begin({point, frame, 1});
    simulator.proceed(result);

    ReplayedTexts texts;
    texts.wrongBits = result.wrongBits.back();
    const morvik::link::Frames& frames = simulator.frames();
    texts.softValues = "block,rsc1_sys,rsc1_par,rsc2_par\n";
    for (std::size_t i = 0; i < frames.streams[0].size(); ++i) {
        texts.softValues += std::to_string(frame);
        for (const auto& stream : frames.streams) {
            texts.softValues += ',' + std::to_string(stream[i]);
        }
        texts.softValues += '\n';
    }
    for (const std::uint8_t bit : frames.sent) {
        texts.sentBits += bit != 0 ? '1' : '0';
    }
    texts.sentBits += '\n';
    return texts;
}

}  // namespace morvik::simulation

// Replay: reproduces one frame of a run for inspection.
#include "Replay.h"

#include "FrameSimulator.h"

namespace morvik::simulation {

namespace {

void append(const ReceivedBlock& block, std::uint64_t number, ReplayedTexts& texts)
{
    for (std::size_t i = 0; i < block.streams[0].size(); ++i) {
        texts.softValues += std::to_string(number);
        for (const auto& stream : block.streams) {
            texts.softValues += ',' + std::to_string(stream[i]);
        }
        texts.softValues += '\n';
    }
    for (const std::uint8_t bit : block.sent) {
        texts.sentBits += bit != 0 ? '1' : '0';
    }
    texts.sentBits += '\n';
}

}  // namespace

ReplayedTexts replay(const Plan& plan, std::size_t point, std::uint64_t frame, const std::string& instructionSet)
{
    FrameSimulator simulator(plan, instructionSet);
    BatchResult result = simulator.begin({point, frame, 1});
    simulator.proceed(result);

    ReplayedTexts texts;
    texts.wrongBits = result.wrongBits.back();
    texts.softValues = "block,rsc1_sys,rsc1_par,rsc2_par\n";
    const std::vector<ReceivedBlock> blocks = simulator.receivedBlocks();
    for (std::size_t b = 0; b < blocks.size(); ++b) {
        // A plain code block has the number of its frame.
        append(blocks[b], blocks.size() == 1 ? frame : b, texts);
    }
    return texts;
}

}  // namespace morvik::simulation

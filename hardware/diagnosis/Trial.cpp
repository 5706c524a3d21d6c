// Trial: decodes cases, and simulated blocks in the same noise.
#include "Trial.h"

#include <algorithm>
#include <cmath>

#include "simulation/FrameSimulator.h"

namespace morvik::diagnosis {

Trial::Trial(const DecoderOptions& options)
    : itsSilence(nullptr), itsDecoder(options.generics, itsSilence), itsIterations(options.iterations)
{
}

Trial::Result Trial::decode(const std::vector<Case>& cases)
{
    Result result;
    std::vector<std::uint8_t> bits;
    for (const Case& block : cases) {
        itsDecoder.decode(block.received, itsIterations, 0, bits);
        std::uint64_t wrong = 0;
        for (std::size_t k = 0; k < bits.size(); ++k) {
            wrong += bits[k] != block.sent[k] ? 1U : 0U;
        }
        result.decoded += wrong == 0 ? 1U : 0U;
        result.wrongBits += wrong;
        if (wrong > 0 && result.failedSize == 0) {
            result.failedSize = bits.size();
        }
    }
    return result;
}

std::uint32_t simulatedFailures(
    const DecoderOptions& options, unsigned K, double ebn0, double scale, std::uint32_t blocks)
{
    simulation::Point point;
    point.blockSize = K;
    point.numPu = static_cast<unsigned>(options.generics.C_NUM_PU);
    point.algorithm = static_cast<unsigned>(options.generics.C_ALGORITHM_TYPE);
    point.iterations = options.iterations;
    point.milliDecibels = static_cast<int>(std::lround(1000 * ebn0));
    point.milliScale = std::max(static_cast<int>(std::lround(1000 * scale)), 1);
    simulation::Plan plan;
    plan.points = {point};
    plan.seed = 1;
    simulation::FrameSimulator simulator(plan, "");
    simulation::BatchResult result = simulator.begin({0, 0, blocks});
    while (simulator.proceed(result)) {
    }
    return static_cast<std::uint32_t>(
        std::count_if(result.wrongBits.begin(), result.wrongBits.end(), [](std::uint32_t wrong) { return wrong > 0; }));
}

}  // namespace morvik::diagnosis

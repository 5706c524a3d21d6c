// NoisyBlocks: the code blocks on which all decoders are measured.
#include "NoisyBlocks.h"

#include <algorithm>
#include <cmath>

#include "support/Blocks.h"

namespace morvik::bench {

namespace {

/// A noiseless soft value, in eighths, for a received amplitude of 1.25.
constexpr int amplitude = 10;

NoisyBlocks makeBlocks(const std::vector<unsigned>& sizes, double deviation)
{
    NoisyBlocks made;
    blocks::Random random(sizes.front());
    for (const unsigned K : sizes) {
        const std::vector<int> bits = blocks::randomBits(random, K);
        blocks::Block block = blocks::encode(bits, amplitude);
        blocks::addNoise(random, deviation, block);
        made.sent.insert(made.sent.end(), bits.begin(), bits.end());
        unsigned s = 0;
        for (const blocks::Stream* stream : {&block.sys, &block.par1, &block.par2}) {
            for (const std::int32_t value : *stream) {
                made.streams[s].push_back(std::clamp(value, -128, 127));
            }
            ++s;
        }
    }
    return made;
}

}  // namespace

NoisyBlocks noisyBlocks(const std::vector<unsigned>& sizes)
{
    // sigma^2 = 1 / (2 R Eb/N0) for the rate R = 1/3 and antipodal signals.
    constexpr double decibels = 1.0;
    return makeBlocks(sizes, amplitude * std::sqrt(3.0 / 2.0 * std::pow(10.0, -decibels / 10.0)));
}

NoisyBlocks cleanBlocks(const std::vector<unsigned>& sizes)
{
    return makeBlocks(sizes, 0.0);
}

}  // namespace morvik::bench

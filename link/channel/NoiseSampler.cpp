// NoiseSampler: Gaussian noise in integers, the same on every machine.
#include "NoiseSampler.h"

#include <algorithm>
#include <array>

#include "link/kernels/RowKernels.h"

namespace morvik::link {

namespace {

constexpr int mostSteps = 126;

/// Numbers that are drawn together: few enough to stay in the first-level cache.
constexpr std::uint32_t partSize = 4096;

constexpr std::array<std::uint64_t, 64> allOnes()
{
    std::array<std::uint64_t, partSize / 64> words{};
    for (std::uint64_t& word : words) {
        word = ~std::uint64_t{0};
    }
    return words;
}

/// Byte i % 8 of a word belongs to number i.
const std::uint8_t* bytesOf(const std::uint64_t* words)
{
    return reinterpret_cast<const std::uint8_t*>(words);
}

}  // namespace

RoundedDistribution coarseNoise()
{
    // exp(-d^2 / 2 s^2) for s = 18: each is the one before times r^(2 d - 1) with r = exp(-1 / 2 s^2).
    constexpr double r = 0.99845798025952968374;
    constexpr unsigned count = mostSteps + 1;
    std::array<double, count> densities{};
    densities[0] = 1;
    double factor = r;
    double sum = 1;
    for (unsigned d = 1; d < count; ++d) {
        densities[d] = densities[d - 1] * factor;
        factor *= r * r;
        sum += 2 * densities[d];
    }
    RoundedDistribution distribution{};
    constexpr std::uint64_t all = std::uint64_t{1} << AliasTable::weightBits;
    const double unit = static_cast<double>(all) / sum;
    std::uint64_t given = 0;
    for (unsigned d = mostSteps; d > 0; --d) {
        const double exact = densities[d] * unit;
        auto weight = static_cast<std::uint64_t>(exact);
        weight += exact - static_cast<double>(weight) >= 0.5 ? 1U : 0U;
        distribution.weights[d] = weight;
        distribution.weights[256 - d] = weight;
        given += 2 * weight;
    }
    distribution.weights[0] = all - given;
    return distribution;
}

NoiseSampler::NoiseSampler(const RandomKey& key, const SamplerForm& form)
    : itsCoarse(coarseNoise(), key, form), itsFine(key, form), itsSteps(partSize)
{
}

void NoiseSampler::draw(const FrameRandom& random, std::uint32_t first, std::uint32_t count, std::int16_t* numbers)
{
    for (std::uint32_t done = 0; done < count; done += partSize) {
        const std::uint32_t now = std::min(partSize, count - done);
        drawParts(random, first + done, now);
        for (std::uint32_t i = 0; i < now; ++i) {
            numbers[done + i] = static_cast<std::int16_t>(256 * itsSteps[i] + bytesOf(itsFine.lows())[i] +
                                                          bytesOf(itsFine.highs())[i] - 255);
        }
    }
}

void NoiseSampler::add(const FrameRandom& random, std::uint32_t first, std::uint32_t count, float unit, float* sums)
{
    for (std::uint32_t done = 0; done < count; done += partSize) {
        const std::uint32_t now = std::min(partSize, count - done);
        drawParts(random, first + done, now);
        rowKernels().addNoise(
            itsSteps.data(), bytesOf(itsFine.lows()), bytesOf(itsFine.highs()), now, unit, sums + done);
    }
}

/// Draws d, u and v of up to `partSize` numbers.
void NoiseSampler::drawParts(const FrameRandom& random, std::uint32_t first, std::uint32_t count)
{
    static constexpr auto ones = allOnes();
    std::uint32_t clipped = 0;  // d does not reach the ends
    itsCoarse.put(random, first, ones.data(), count, itsSteps.data(), clipped);
    itsCoarse.draw();
    itsFine.clear();
    itsFine.put(random.counterLow(random_index::fineNoise + first / 8), random.counterHigh(), (count + 7) / 8);
    itsFine.draw();
}

}  // namespace morvik::link

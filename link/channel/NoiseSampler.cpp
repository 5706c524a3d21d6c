// NoiseSampler: Gaussian noise in integers, the same on every machine.
#include "NoiseSampler.h"

#include <algorithm>
#include <array>

#include "link/kernels/RowKernels.h"

namespace morvik::link {

namespace {

constexpr int mostLevel = 126;

/// Numbers that are drawn together, whole groups: few enough to stay in the first-level cache.
constexpr std::uint32_t partSize = 4096;

}  // namespace

AliasTable::Weights coarseNoise()
{
    // exp(-d^2 / 2 s^2) for s = 18: each is the one before times r^(2 d - 1) with r = exp(-1 / 2 s^2).
    constexpr double r = 0.99845798025952968374;
    constexpr unsigned count = mostLevel + 1;
    std::array<double, count> densities{};
    densities[0] = 1;
    double factor = r;
    double sum = 1;
    for (unsigned d = 1; d < count; ++d) {
        densities[d] = densities[d - 1] * factor;
        factor *= r * r;
        sum += 2 * densities[d];
    }
    AliasTable::Weights weights{};
    constexpr std::uint64_t all = std::uint64_t{1} << AliasTable::weightBits;
    const double unit = static_cast<double>(all) / sum;
    std::uint64_t given = 0;
    for (unsigned d = mostLevel; d > 0; --d) {
        const double exact = densities[d] * unit;
        auto weight = static_cast<std::uint64_t>(exact);
        weight += exact - static_cast<double>(weight) >= 0.5 ? 1U : 0U;
        weights[d] = weight;
        weights[256 - d] = weight;
        given += 2 * weight;
    }
    weights[0] = all - given;
    return weights;
}

NoiseSampler::NoiseSampler(const RandomKey& key, const SamplerForm& form)
    : itsTable(coarseNoise()),
      itsKey(key),
      itsForm(form),
      itsRefinements(key, form),
      itsNumbers(partSize),
      itsLevels(partSize),
      itsUndecided(partSize / 64)
{
}

void NoiseSampler::draw(const FrameRandom& random, std::uint32_t first, std::uint32_t count, std::int16_t* numbers)
{
    for (std::uint32_t done = 0; done < count; done += partSize) {
        const std::uint32_t now = std::min(partSize, count - done);
        drawPart(random, first + done, now);
        std::copy_n(itsNumbers.begin(), now, numbers + done);
    }
}

void NoiseSampler::add(const FrameRandom& random, std::uint32_t first, std::uint32_t count, float unit, float* sums)
{
    for (std::uint32_t done = 0; done < count; done += partSize) {
        const std::uint32_t now = std::min(partSize, count - done);
        drawPart(random, first + done, now);
        rowKernels().addNoise(itsNumbers.data(), now, unit, sums + done);
    }
}

/// Draws up to `partSize` numbers.
void NoiseSampler::drawPart(const FrameRandom& random, std::uint32_t first, std::uint32_t count)
{
    const std::size_t groups = (count + 63) / 64;
    const NoiseCounters counters = {random.counterLow(random_index::softValues + first / 8),
                                    random.counterLow(random_index::fineNoise + first / 8),
                                    random.counterHigh()};
    itsForm.noise(itsTable, itsKey, counters, groups, {itsNumbers.data(), itsLevels.data(), itsUndecided.data()});
    decide(random, first, groups);
}

/// Decides levels that are an entry's own for now: one in 256. Each has 32 bits of a random block of its own.
void NoiseSampler::decide(const FrameRandom& random, std::uint32_t first, std::size_t groups)
{
    itsOpen.clear();
    itsRefinements.clear();
    for (std::uint32_t g = 0; g < groups; ++g) {
        for (std::uint64_t left = itsUndecided[g]; left != 0; left &= left - 1) {
            const std::uint32_t i = 64 * g + static_cast<std::uint32_t>(__builtin_ctzll(left));
            itsOpen.push_back(i);
            itsRefinements.put(random.counterLow(random_index::refinements + first + i), random.counterHigh());
        }
    }
    itsRefinements.draw();
    for (std::size_t n = 0; n < itsOpen.size(); ++n) {
        const std::uint32_t i = itsOpen[n];
        const auto entry = static_cast<std::uint8_t>(itsLevels[i]);
        if ((itsRefinements.low(n) & 0xFFFFFFFF) >= itsTable.lowThreshold[entry]) {
            const int change = static_cast<std::int8_t>(itsTable.alias[entry]) - itsLevels[i];
            itsNumbers[i] = static_cast<std::int16_t>(itsNumbers[i] + 256 * change);
        }
    }
}

}  // namespace morvik::link

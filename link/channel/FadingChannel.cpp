// FadingChannel: white Gaussian noise and Rayleigh fading on symbols, the same on every machine.
#include "FadingChannel.h"

#include <algorithm>
#include <cmath>
#include <stdexcept>
#include <string>

#include "Decibels.h"
#include "link/kernels/RowKernels.h"

namespace morvik::link {

namespace {

constexpr std::array<std::string_view, fadings.size()> names = {"awgn", "rayleigh", "block-rayleigh"};

int checked(int milliDecibels)
{
    if (milliDecibels < -mostMilliDecibels || milliDecibels > mostMilliDecibels) {
        throw std::invalid_argument("an Es/N0 of " + std::to_string(milliDecibels) + " thousandths of a decibel");
    }
    return milliDecibels;
}

/// What makes the square of a complex Gaussian number one of mean energy 1. The sum of the squares fits in 31 bits.
constexpr auto energyUnit = static_cast<float>(1 / (2 * levelDeviation * levelDeviation));
static_assert(std::int64_t{2} * mostNoise * mostNoise <= INT32_MAX);

}  // namespace

std::string_view nameOf(Fading fading)
{
    return names[static_cast<unsigned>(fading)];
}

std::optional<Fading> fadingOf(std::string_view name)
{
    const auto* const found = std::find(names.begin(), names.end(), name);
    return found == names.end() ? std::nullopt
                                : std::optional(fadings[static_cast<std::size_t>(found - names.begin())]);
}

FadingChannel::FadingChannel(
    Fading fading, unsigned dimensions, int milliDecibels, const RandomKey& key, const SamplerForm& form)
    : itsFading(fading),
      itsDimensions(dimensions),
      itsKey(key),
      itsNoiseVariance(static_cast<float>(ratioOf(-checked(milliDecibels)))),
      itsNoiseUnit(static_cast<float>(std::sqrt(ratioOf(-milliDecibels) / 2) / levelDeviation)),
      itsSampler(key, form)
{
}

void FadingChannel::pass(
    std::uint64_t frame, unsigned transmission, std::uint32_t first, std::uint32_t count, float* symbols, float* gains)
{
    if (hasGains()) {
        drawGains(FrameRandom(itsKey, 2 * transmission + 1, frame), first, count, gains);
        rowKernels().fade(gains, count, itsDimensions, symbols);
    }
    itsSampler.add(FrameRandom(itsKey, 2 * transmission, frame),
                   itsDimensions * first,
                   itsDimensions * count,
                   itsNoiseUnit,
                   symbols);
}

void FadingChannel::drawGains(const FrameRandom& random, std::uint32_t first, std::uint32_t count, float* gains)
{
    const RowKernels& kernels = rowKernels();
    if (itsFading == Fading::constant) {
        std::array<std::int16_t, 2> numbers;
        itsSampler.draw(random, 0, 2, numbers.data());
        kernels.amplitudes(numbers.data(), 1, energyUnit, gains);
        std::fill_n(gains, count, gains[0]);
        return;
    }
    itsNumbers.resize(std::max(itsNumbers.size(), std::size_t{2} * count));
    itsSampler.draw(random, 2 * first, 2 * count, itsNumbers.data());
    kernels.amplitudes(itsNumbers.data(), count, energyUnit, gains);
}

}  // namespace morvik::link

// FadingChannel: white Gaussian noise and Rayleigh fading on symbols, the same on every machine.
#ifndef MORVIK_LINK_CHANNEL_FADINGCHANNEL_H
#define MORVIK_LINK_CHANNEL_FADINGCHANNEL_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>
#include <vector>

#include "NoiseSampler.h"

namespace morvik::link {

enum class Fading {
    none,      ///< every gain is 1
    symbol,    ///< Rayleigh, independent for each symbol
    constant,  ///< Rayleigh, one gain for a transmission
};

constexpr std::array<Fading, 3> fadings = {Fading::none, Fading::symbol, Fading::constant};

/// The channel's name: awgn, rayleigh, block-rayleigh.
std::string_view nameOf(Fading fading);
std::optional<Fading> fadingOf(std::string_view name);

/// A channel for symbols of mean energy 1 in one or two dimensions. The receiver knows the gains and has corrected the
/// phase, so a gain is the amplitude of a complex Gaussian number of mean energy 1.
class FadingChannel {
public:
    /// `milliDecibels` is the Es/N0 in thousandths of a decibel, -mostMilliDecibels to mostMilliDecibels. Throws
    /// std::invalid_argument otherwise. `form` is for tests.
    FadingChannel(Fading fading,
                  unsigned dimensions,
                  int milliDecibels,
                  const RandomKey& key,
                  const SamplerForm& form = samplerForms().front());

    /// N0: the noise's variance in both dimensions together, or twice that in a single one.
    float noiseVariance() const
    {
        return itsNoiseVariance;
    }

    /// Turns `count` sent symbols into received ones, from symbol `first` of a transmission on; `first` is a multiple
    /// of 64. Sets their gains unless all are 1.
    void pass(std::uint64_t frame,
              unsigned transmission,
              std::uint32_t first,
              std::uint32_t count,
              float* symbols,
              float* gains);

    bool hasGains() const
    {
        return itsFading != Fading::none;
    }

private:
    void drawGains(const FrameRandom& random, std::uint32_t first, std::uint32_t count, float* gains);

    Fading itsFading;
    unsigned itsDimensions;
    RandomKey itsKey;
    float itsNoiseVariance;
    float itsNoiseUnit;  // the noise of one step of a number
    NoiseSampler itsSampler;
    std::vector<std::int16_t> itsNumbers;
};

}  // namespace morvik::link

#endif

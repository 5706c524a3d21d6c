// SymbolLink: sends coded bits through mapper, channel and demapper; returns log-likelihood ratios.
#ifndef MORVIK_LINK_SYMBOLLINK_H
#define MORVIK_LINK_SYMBOLLINK_H

#include <cstddef>
#include <cstdint>
#include <vector>

#include "link/channel/FadingChannel.h"
#include "link/modulation/Demapper.h"
#include "link/modulation/Modulation.h"

namespace morvik::link {

/// How coded bits are sent and received.
struct SymbolFormat {
    Modulation modulation = Modulation::bpsk;
    Fading fading = Fading::none;
    Demapper demapper = Demapper::maxLog;
    int milliDecibels = 0;  ///< Es/N0 in thousandths of a decibel
};

/// The part of the random key that distinguishes formats. It does not depend on the receiver's choices.
std::uint64_t keyWordOf(const SymbolFormat& format);

class SymbolLink {
public:
    /// Throws std::invalid_argument for an Es/N0 that FadingChannel refuses.
    SymbolLink(const SymbolFormat& format, const RandomKey& key, const SamplerForm& form);

    /// The ratios ln(P(1) / P(0)) of `count` packed bits, a multiple of the modulation's, that a frame sends in one
    /// transmission.
    void receive(
        std::uint64_t frame, unsigned transmission, const std::uint64_t* bits, std::size_t count, float* ratios);

private:
    SymbolFormat itsFormat;
    FadingChannel itsChannel;
    std::vector<float> itsSymbols;
    std::vector<float> itsGains;
};

/// The ratios of rows of `count` bits, each a byte of 0 or 1. A row is a frame of a simulation with this seed.
void transmitRows(const SymbolFormat& format,
                  std::uint64_t seed,
                  const std::uint8_t* bits,
                  std::size_t rows,
                  std::size_t count,
                  float* ratios);

}  // namespace morvik::link

#endif

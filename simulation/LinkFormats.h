// LinkFormats: what the options of `morvik ber` that describe the link send. Python has the same options.
#ifndef MORVIK_APP_BER_LINKFORMATS_H
#define MORVIK_APP_BER_LINKFORMATS_H

#include <optional>
#include <string>
#include <vector>

#include "simulation/LinkFormat.h"

namespace morvik {

constexpr unsigned usualResourceElements = 120;  // of the 168 of a pair, without control and reference signals

/// The options given; empty where the default depends on other options.
struct LinkOptions {
    std::vector<unsigned> transportBlockSizes;
    std::vector<unsigned> codedBits;
    std::vector<int> codeRates;  // in thousandths
    std::vector<unsigned> mcsIndices;
    std::optional<link::McsTable> mcsTable;
    std::optional<unsigned> resourceBlocks;
    std::optional<unsigned> resourceElements;  // of a pair of resource blocks
    std::vector<link::Modulation> modulations;
    std::vector<unsigned> versions;
    std::optional<unsigned> softBufferBits;
    std::optional<unsigned> softBufferSize;
    std::optional<link::Fading> fading;
    std::optional<link::Demapper> demapper;
    std::optional<bool> stopsEarly;

    bool hasTransportBlocks() const
    {
        return !transportBlockSizes.empty() || !mcsIndices.empty();
    }
};

/// What every combination of the options sends. `hasBlockSize`: plain code blocks are asked for. Throws base::Error for
/// options that contradict each other or cannot be met.
std::vector<simulation::LinkFormat> formatsOf(const LinkOptions& options, bool hasBlockSize);

/// A line for the options whose code rate is above that at which a terminal may leave out decoding (3GPP TS 36.213,
/// 7.1.7): how many formats have it, and the highest. Empty if none has.
std::string highRateWarning(const std::vector<simulation::LinkFormat>& formats);

}  // namespace morvik

#endif

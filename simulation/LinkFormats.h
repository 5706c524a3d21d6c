// LinkFormats: what the options of `morvik ber` that describe the link send. Python has the same options.
#ifndef MORVIK_SIMULATION_LINKFORMATS_H
#define MORVIK_SIMULATION_LINKFORMATS_H

#include <optional>
#include <string>
#include <vector>

#include "LinkFormat.h"

namespace morvik::simulation {

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
std::vector<LinkFormat> formatsOf(const LinkOptions& options, bool hasBlockSize);

/// The code rate of a transmission of transport blocks, with CRCs as information.
double effectiveRate(const LinkFormat& format);

}  // namespace morvik::simulation

#endif

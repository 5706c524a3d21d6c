// LinkOptions: the arguments of `morvik ber` that say what is sent, and how.
#ifndef MORVIK_APP_BER_LINKOPTIONS_H
#define MORVIK_APP_BER_LINKOPTIONS_H

#include <CLI/CLI.hpp>
#include <optional>
#include <string>
#include <vector>

#include "simulation/Plan.h"

namespace morvik {

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

/// Adds the options, which set `options`.
void addLinkOptions(CLI::App& command, LinkOptions& options);

/// What every combination of the options sends. `hasBlockSize`: plain code blocks are asked for. Throws base::Error for
/// options that contradict each other or cannot be met.
std::vector<simulation::LinkFormat> formatsOf(const LinkOptions& options, bool hasBlockSize);

/// The options as a command repeats them, each after a blank.
std::string commandOf(const LinkOptions& options);

}  // namespace morvik

#endif

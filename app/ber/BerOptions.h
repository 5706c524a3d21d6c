// BerOptions: the arguments of `morvik ber`.
#ifndef MORVIK_APP_BER_BEROPTIONS_H
#define MORVIK_APP_BER_BEROPTIONS_H

#include <CLI/CLI.hpp>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>

#include "LinkOptions.h"
#include "Pictures.h"
#include "simulation/Plan.h"

namespace morvik {

/// A frame of a point.
struct ReplayedFrame {
    std::size_t point = 0;
    std::uint64_t frame = 0;
};

/// The options given; empty where the default depends on other options.
struct BerOptions {
    simulation::Sweep sweep;
    simulation::LinkOptions link;
    bool eachIteration = false;
    std::optional<std::uint64_t> blockErrors;
    std::optional<std::uint64_t> bitErrors;
    std::optional<std::uint64_t> maxBlocks;
    std::optional<double> maxSeconds;
    std::optional<double> stopBler;
    std::optional<simulation::FrameRange> frames;
    std::uint64_t seed = 1;

    std::uint32_t threads = 0;  // 0 for all cores
    std::string instructionSet;
    std::string output;
    double secondsBetweenCheckpoints = 3;
    bool resume = false;
    bool overwrite = false;
    bool quiet = false;
    PictureOptions pictures;
    std::optional<ReplayedFrame> replay;
};

/// Adds the options, which set `options`.
void addBerOptions(CLI::App& command, BerOptions& options);

/// The plan for the options, with all defaults.
simulation::Plan planOf(const BerOptions& options);

}  // namespace morvik

#endif

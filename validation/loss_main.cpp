// morvik_loss: BLER behind the LTE chain, of the floating-point reference and of decoders that lead from there to the
// hardware. All decode the same received values, so their differences are far more exact than each rate.
#include <CLI/CLI.hpp>
#include <array>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <exception>
#include <iostream>
#include <optional>
#include <string>
#include <vector>

#include "LossDecoders.h"
#include "ReceivedBlocks.h"
#include "link/RatioScale.h"

namespace {

using namespace morvik::validation;

struct Options {
    ChainFormat chain;
    std::string modulation;
    std::string demapper = "max-log";
    unsigned iterations = 8;
    std::optional<double> scale;  ///< that of `morvik ber`, if none
    std::vector<int> milliDecibels;
    std::uint64_t blockErrors = 300;
    std::uint64_t maxBlocks = 100000;
    std::vector<std::string> decoders;
};

/// Decodes the blocks of a point until the first decoder, the best one, has failed often enough. A disagreement is a
/// block that exactly one of a decoder and the one before it decodes.
void simulatePoint(const Options& options, int milliDecibels)
{
    ReceivedBlocks blocks(options.chain, milliDecibels);
    const double codeRate = static_cast<double>(options.chain.bits) / options.chain.codedBits;
    const double scale =
        options.scale.value_or(morvik::link::ratioScale(scaledAlgorithm, options.chain.modulation, codeRate));
    LossDecoders decoders(blocks.code(), options.decoders, static_cast<float>(scale), options.iterations);
    const std::size_t kinds = options.decoders.size();
    std::vector<std::uint64_t> errors(kinds);
    std::vector<std::uint64_t> disagreements(kinds);
    std::uint64_t count = 0;
    while (count < options.maxBlocks && errors[0] < options.blockErrors) {
        blocks.make(count);
        count += ReceivedBlocks::atOnce;
        std::vector<bool> before;
        for (std::size_t i = 0; i < kinds; ++i) {
            const std::vector<bool> failed = decoders.failures(i, blocks);
            for (std::size_t b = 0; b < failed.size(); ++b) {
                errors[i] += failed[b] ? 1U : 0U;
                disagreements[i] += i > 0 && failed[b] != before[b] ? 1U : 0U;
            }
            before = failed;
        }
    }
    for (std::size_t i = 0; i < kinds; ++i) {
        std::printf("%s,%s,%u,%u,%.3f,%u,%.3f,%s,%llu,%llu,%llu\n",
                    options.modulation.c_str(),
                    options.demapper.c_str(),
                    options.chain.bits,
                    options.chain.codedBits,
                    scale,
                    options.iterations,
                    milliDecibels / 1000.0,
                    options.decoders[i].c_str(),
                    static_cast<unsigned long long>(count),
                    static_cast<unsigned long long>(errors[i]),
                    static_cast<unsigned long long>(disagreements[i]));
    }
    std::fflush(stdout);
}

std::vector<std::string> names()
{
    return {LossDecoders::names.begin(), LossDecoders::names.end()};
}

void addOptions(CLI::App& app, Options& options)
{
    app.add_option("--modulation", options.modulation, "bpsk, qpsk, 16qam, 64qam or 256qam")->required();
    app.add_option("--demapper", options.demapper, "max-log or exact");
    app.add_option("--transport-block-size", options.chain.bits, "A, of one code block")->required();
    app.add_option("--coded-bits", options.chain.codedBits, "G")->required();
    app.add_option("--iterations", options.iterations, "Turbo iterations, 1 to 15")->check(CLI::Range(1, 15));
    app.add_option("--scale", options.scale, "Soft value for a ratio of 1; by default that of `morvik ber`")
        ->check(CLI::PositiveNumber);
    app.add_option("--esn0-millidb", options.milliDecibels, "Es/N0 in thousandths of a decibel")
        ->delimiter(',')
        ->required();
    app.add_option("--block-errors", options.blockErrors, "End a point when the first decoder has failed so often");
    app.add_option("--max-blocks", options.maxBlocks, "End a point with the block N");
    app.add_option("--decoders", options.decoders, "Which decoders, by name; all without it")
        ->delimiter(',')
        ->check(CLI::IsMember(names()));
}

}  // namespace

int main(int argc, char** argv)
{
    Options options;
    CLI::App app("Block error rates behind the LTE chain, from floating point to the hardware, as CSV");
    addOptions(app, options);
    CLI11_PARSE(app, argc, argv);
    try {
        if (options.decoders.empty()) {
            options.decoders = names();
        }
        options.chain.modulation = named(morvik::link::modulationOf(options.modulation), options.modulation);
        options.chain.demapper = named(morvik::link::demapperOf(options.demapper), options.demapper);
        std::puts(
            "modulation,demapper,transport_block_size,coded_bits,scale,iterations,esn0_db,decoder,blocks,block_errors,"
            "disagreements");
        for (const int milliDecibels : options.milliDecibels) {
            simulatePoint(options, milliDecibels);
        }
    } catch (const std::exception& problem) {
        std::cerr << "morvik_loss: " << problem.what() << '\n';
        return 2;
    }
    return 0;
}

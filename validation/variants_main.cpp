// morvik_variants: BLER of decoders that lead, step by step, from fine, undivided arithmetic to the hardware's. All
// variants decode the same received values, so their differences are far more exact than each rate.
#include <CLI/CLI.hpp>
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <exception>
#include <iostream>
#include <string>
#include <vector>

#include "VariantDecoder.h"
#include "link/channel/Channel.h"
#include "link/channel/DefaultScale.h"
#include "link/coding/TurboEncoder.h"
#include "link/random/GaussianNumber.h"
#include "link/random/Random.h"
#include "rules/Tail.h"

namespace {

using namespace morvik::link;
using morvik::validation::Variant;
using morvik::validation::VariantDecoder;
using morvik::validation::variants;

/// Received blocks of random bits, from seed 1.
class ReceivedBlocks {
public:
    ReceivedBlocks(unsigned K, int milliDecibels)
        : itsK(K),
          itsMilliDecibels(milliDecibels),
          itsDeviation(static_cast<double>(noiseDeviation(K, milliDecibels))),
          itsEncoder(K)
    {
    }

    void make(std::uint64_t number)
    {
        const FrameRandom random(randomKey(1), itsK, itsMilliDecibels, number);
        PackedBlocks information{itsEncoder.words(), std::vector<std::uint64_t>(itsEncoder.words())};
        sent.assign(itsK, 0);
        for (unsigned i = 0; i < itsK; ++i) {
            const RandomBlock block = random.block(random_index::information + i / 128);
            sent[i] = block[i % 128 / 32] >> i % 32 & 1;
            information.bits[i / 64] |= std::uint64_t{sent[i]} << i % 64;
        }
        itsEncoder.encode(information, 1, itsStreams);
        received.clear();
        for (unsigned i = 0; i < 3 * (itsK + morvik::rules::tailPositions); ++i) {
            const std::uint64_t bit = itsStreams[i % 3].bits[i / 3 / 64] >> i / 3 % 64 & 1;
            const double noise = gaussianNumber(random.block(random_index::gaussian + i));
            received.push_back((bit != 0 ? 1 : -1) + itsDeviation * noise);
        }
    }

    std::vector<unsigned char> sent;
    std::vector<double> received;

private:
    unsigned itsK;
    int itsMilliDecibels;
    double itsDeviation;
    TurboEncoder itsEncoder;
    TurboEncoder::Streams itsStreams;
};

struct Options {
    unsigned blockSize = 0;
    int algorithm = 1;
    unsigned iterations = 8;
    std::vector<int> milliDecibels;
    std::uint64_t blockErrors = 300;
    std::uint64_t maxBlocks = 1000000;
    std::vector<std::string> variants;  ///< names; if empty, all
};

/// Whether a variant takes part: the correction table only works with three fraction bits.
bool isSimulated(const Variant& variant, const Options& options)
{
    const bool hasTable = std::string(variant.stateFormat) == "Fix_12_3";
    const auto& names = options.variants;
    const bool isNamed = names.empty() || std::find(names.begin(), names.end(), variant.name) != names.end();
    return isNamed && (options.algorithm != 2 || hasTable);
}

std::vector<std::string> variantNames()
{
    std::vector<std::string> names;
    names.reserve(variants.size());
    for (const Variant& variant : variants) {
        names.emplace_back(variant.name);
    }
    return names;
}

/// The indices of the variants that take part.
std::vector<std::size_t> simulatedVariants(const Options& options)
{
    std::vector<std::size_t> simulated;
    for (std::size_t i = 0; i < variants.size(); ++i) {
        if (isSimulated(variants[i], options)) {
            simulated.push_back(i);
        }
    }
    return simulated;
}

/// For each variant, the index of the nearest participating one before it, or its own.
std::vector<std::size_t> predecessorsOf(const std::vector<std::size_t>& simulated)
{
    std::vector<std::size_t> places;
    for (std::size_t i = 0; i < simulated.size(); ++i) {
        auto found = simulated.begin() + static_cast<std::ptrdiff_t>(i);
        for (std::size_t before = simulated[i]; before > 0 && *found == simulated[i];) {
            before = variants[before].predecessor;
            const auto place = std::find(simulated.begin(), simulated.end(), before);
            found = place != simulated.end() ? place : found;
        }
        places.push_back(static_cast<std::size_t>(found - simulated.begin()));
    }
    return places;
}

/// Decodes the blocks of a point until the first variant, the best one, has failed often enough. A disagreement is a
/// block that exactly one of a variant and its predecessor decodes.
void simulatePoint(const Options& options, int milliDecibels)
{
    const std::vector<std::size_t> simulated = simulatedVariants(options);
    const std::vector<std::size_t> predecessors = predecessorsOf(simulated);
    std::vector<VariantDecoder> decoders;
    decoders.reserve(simulated.size());
    for (const std::size_t variant : simulated) {
        decoders.emplace_back(variants[variant], options.algorithm);
    }
    const double scale = defaultScale(options.algorithm, options.blockSize, milliDecibels);
    std::vector<std::uint64_t> errors(decoders.size());
    std::vector<std::uint64_t> disagreements(decoders.size());
    std::vector<bool> failed(decoders.size());
    ReceivedBlocks blocks(options.blockSize, milliDecibels);
    std::uint64_t count = 0;
    for (; count < options.maxBlocks && errors[0] < options.blockErrors; ++count) {
        blocks.make(count);
        for (std::size_t i = 0; i < decoders.size(); ++i) {
            failed[i] = decoders[i].decode(blocks.received, scale, options.iterations) != blocks.sent;
            errors[i] += failed[i] ? 1U : 0U;
            disagreements[i] += failed[i] != failed[predecessors[i]] ? 1U : 0U;
        }
    }
    for (std::size_t i = 0; i < decoders.size(); ++i) {
        std::printf("%u,%s,%d,%u,%.3f,%llu,%llu,%llu\n",
                    options.blockSize,
                    variants[simulated[i]].name,
                    options.algorithm,
                    options.iterations,
                    milliDecibels / 1000.0,
                    static_cast<unsigned long long>(count),
                    static_cast<unsigned long long>(errors[i]),
                    static_cast<unsigned long long>(disagreements[i]));
    }
    std::fflush(stdout);
}

}  // namespace

int main(int argc, char** argv)
{
    Options options;
    CLI::App app("Block error rates of variants of the model, as CSV");
    app.add_option("--block-size", options.blockSize, "Bits of a block, K")->required();
    app.add_option("--algorithm", options.algorithm, "0, 1 or 2")->check(CLI::Range(0, 2));
    app.add_option("--iterations", options.iterations, "Turbo iterations, 1 to 15")->check(CLI::Range(1, 15));
    app.add_option("--ebn0-millidb", options.milliDecibels, "Eb/N0 in thousandths of a decibel")
        ->delimiter(',')
        ->required();
    app.add_option("--block-errors", options.blockErrors, "End a point when the first variant has failed so often");
    app.add_option("--max-blocks", options.maxBlocks, "End a point with the block N");
    app.add_option("--variants", options.variants, "Which variants, by name; all without it")
        ->delimiter(',')
        ->check(CLI::IsMember(variantNames()));
    CLI11_PARSE(app, argc, argv);
    try {
        std::puts("block_size,variant,algorithm,iterations,ebn0_db,blocks,block_errors,disagreements");
        for (const int milliDecibels : options.milliDecibels) {
            simulatePoint(options, milliDecibels);
        }
    } catch (const std::exception& problem) {
        std::cerr << "morvik_variants: " << problem.what() << '\n';
        return 2;
    }
    return 0;
}

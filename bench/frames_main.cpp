// morvik_bench_frames: compares the cost of making the frames of a simulation with that of decoding them.
#include <CLI/CLI.hpp>
#include <iomanip>
#include <iostream>
#include <stdexcept>
#include <string>
#include <vector>

#include "Measure.h"
#include "Options.h"
#include "link/FrameSource.h"
#include "support/Blocks.h"

#include "morvik_v1_0_batch.h"
#include "rules/Tail.h"

namespace {

using namespace morvik::link;

constexpr int milliDecibels = 1000;
constexpr double scale = 8;
constexpr std::uint64_t seed = 1;
constexpr int units = 4;
constexpr int algorithm = 1;

/// Frames of one size, made and decoded `count` at a time, in separate stages or as a whole.
class Stages {
public:
    Stages(unsigned K, unsigned count, const SamplerForm& form)
        : itsK(K),
          itsCount(count),
          itsEncoder(K),
          itsSampler(roundedDistribution(noiseDeviation(K, milliDecibels), scale), randomKey(seed), form),
          itsSource(K, milliDecibels, scale, seed, Noise::discrete, form),
          itsDecoder(units, algorithm)
    {
        // The decoder's instruction sets have the same names.
        if (veltra_ip_morvik_v1_0_set_instruction_set(itsDecoder.state(), form.name) != 0) {
            throw std::runtime_error(std::string("no such decoder: ") + form.name);
        }
        itsInformation.words = itsEncoder.words();
        itsInformation.bits.resize(count * itsInformation.words);
        encode();
        make();
        checkDecisions(form.name);
    }

    void encode()
    {
        itsEncoder.encode(itsInformation, itsCount, itsStreams);
    }

    /// Random numbers and soft values.
    void receive()
    {
        for (unsigned i = 0; i < itsCount; ++i) {
            for (unsigned s = 0; s < 3; ++s) {
                itsSampler.put({randomKey(seed), itsK, milliDecibels, i},
                               8192 * s,
                               itsStreams[s].block(i),
                               itsK + morvik::rules::tailPositions,
                               &itsFrames.streams[s][std::size_t{i} * (itsK + morvik::rules::tailPositions)],
                               itsFrames.clipped[i]);
            }
            if (itsSampler.size() >= 256) {
                itsSampler.draw();
            }
        }
        itsSampler.draw();
    }

    void make()
    {
        itsSource.make(0, itsCount, itsFrames);
    }

    void decode()
    {
        decodeBy(itsDecoder);
    }

    /// Cycles per information bit, the median of the repetitions.
    double cycles(void (Stages::*stage)(), const morvik::bench::Options& options)
    {
        const morvik::bench::Stopwatch once;
        (this->*stage)();
        const auto calls = static_cast<unsigned>(options.seconds / once.stop(1).seconds) + 1;
        std::vector<double> samples;
        for (unsigned i = 0; i < options.repetitions; ++i) {
            const morvik::bench::Stopwatch stopwatch;
            for (unsigned call = 0; call < calls; ++call) {
                (this->*stage)();
            }
            samples.push_back(stopwatch.stop(calls).cycles / (double{1} * itsK * itsCount));
        }
        return morvik::bench::median(samples);
    }

private:
    /// The components define the decisions.
    void checkDecisions(const std::string& instructionSet)
    {
        morvik::blocks::Decoder components(units, algorithm);
        components.decodeByComponents();
        decodeBy(components);
        const std::vector<std::uint8_t> expected = itsDecisions;
        decode();
        if (itsDecisions != expected) {
            throw std::runtime_error("K=" + std::to_string(itsK) + '/' + instructionSet +
                                     ": decodes to other bits than the components");
        }
    }

    void decodeBy(const morvik::blocks::Decoder& decoder)
    {
        itsDecisions.resize(itsFrames.sent.size());
        veltra_ip_morvik_v1_0_batch_outputs outputs = {};
        outputs.dout = itsDecisions.data();
        outputs.dout_alloc = itsDecisions.size();
        const std::int32_t status =
            veltra_ip_morvik_v1_0_batch_simulate_i8(decoder.state(),
                                                    itsFrames.streams[0].data(),
                                                    itsFrames.streams[1].data(),
                                                    itsFrames.streams[2].data(),
                                                    static_cast<std::int32_t>(itsK + morvik::rules::tailPositions),
                                                    itsCount,
                                                    morvik::bench::iterations,
                                                    nullptr,
                                                    &outputs);
        if (status != 0) {
            throw std::runtime_error("status " + std::to_string(status));
        }
    }

    unsigned itsK;
    unsigned itsCount;
    TurboEncoder itsEncoder;
    SoftValueSampler itsSampler;
    FrameSource itsSource;
    morvik::blocks::Decoder itsDecoder;
    PackedBlocks itsInformation;
    TurboEncoder::Streams itsStreams;
    Frames itsFrames;
    std::vector<std::uint8_t> itsDecisions;
};

void measure(const morvik::bench::Options& options)
{
    std::cout
        << "Making frames, and decoding them with " << units << " units, type " << algorithm << ", "
        << morvik::bench::iterations << " iterations: cycles for an information bit\n\n"
        << "|    K | frames a call | instructions | encode | soft values | make, in all | decode | make / decode |\n"
        << "|-----:|--------------:|--------------|-------:|------------:|-------------:|-------:|--------------:|\n"
        << std::fixed << std::setprecision(2);
    for (const SamplerForm& form : samplerForms()) {
        for (const unsigned K : {6144U, 512U, 40U}) {
            for (const unsigned count : {64U, 16U}) {
                Stages stages(K, count, form);
                const double encode = stages.cycles(&Stages::encode, options);
                const double receive = stages.cycles(&Stages::receive, options);
                const double make = stages.cycles(&Stages::make, options);
                const double decode = stages.cycles(&Stages::decode, options);
                std::cout << "| " << std::setw(4) << K << " | " << std::setw(13) << count << " | " << std::left
                          << std::setw(12) << form.name << std::right << " | " << std::setw(6) << encode << " | "
                          << std::setw(11) << receive << " | " << std::setw(12) << make << " | " << std::setw(6)
                          << decode << " | " << std::setw(11) << 100 * make / decode << " % |\n"
                          << std::flush;
            }
        }
    }
}

}  // namespace

int main(int argc, char** argv)
{
    CLI::App app("Measures what it takes to make the frames of a simulation.", "morvik_bench_frames");
    morvik::bench::Options options;
    app.add_option("--repetitions", options.repetitions, "Of each figure, which is their median")
        ->check(CLI::Range(1U, 1000U));
    app.add_option("--seconds", options.seconds, "That a repetition takes at least")->check(CLI::Range(0.0, 100.0));
    CLI11_PARSE(app, argc, argv);
    try {
        measure(options);
    } catch (const std::exception& error) {
        std::cerr << "morvik_bench_frames: " << error.what() << '\n';
        return 1;
    }
    return 0;
}

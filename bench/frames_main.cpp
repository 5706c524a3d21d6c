// morvik_bench_frames: compares the cost of making the frames of a simulation with that of decoding them.
#include <CLI/CLI.hpp>
#include <iomanip>
#include <iostream>
#include <numeric>
#include <stdexcept>
#include <string>
#include <vector>

#include "Measure.h"
#include "Options.h"
#include "link/FrameSource.h"
#include "link/RatioScale.h"
#include "link/TransportSource.h"
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

/// Cycles per information bit of a stage, the median of the repetitions.
template <class Stages>
double cyclesOf(Stages& stages, void (Stages::*stage)(), double bits, const morvik::bench::Options& options)
{
    const morvik::bench::Stopwatch once;
    (stages.*stage)();
    const auto calls = static_cast<unsigned>(options.seconds / once.stop(1).seconds) + 1;
    std::vector<double> samples;
    for (unsigned i = 0; i < options.repetitions; ++i) {
        const morvik::bench::Stopwatch stopwatch;
        for (unsigned call = 0; call < calls; ++call) {
            (stages.*stage)();
        }
        samples.push_back(stopwatch.stop(calls).cycles / bits);
    }
    return morvik::bench::median(samples);
}

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

/// Transport blocks of one code block, made and decoded together.
class TransportStages {
public:
    TransportStages(Modulation modulation, double rate, int milliEsn0, const SamplerForm& form)
        : itsSource(settingOf(modulation, rate, milliEsn0), seed, form), itsDecoder(units, algorithm)
    {
        veltra_ip_morvik_v1_0_set_instruction_set(itsDecoder.state(), form.name);
        std::iota(itsFrames.begin(), itsFrames.end(), 0U);
        make();
    }

    void begin()
    {
        itsSource.begin(0, blocks);
    }

    /// All transmissions' work: symbols, noise, ratios, soft values.
    void transmit()
    {
        itsSource.transmit(itsFrames, 0, itsBatches, itsClipped.data());
    }

    void make()
    {
        begin();
        transmit();
    }

    void decode()
    {
        const CodeBlockBatch& batch = itsBatches[1];
        itsDecisions.resize(std::size_t{blocks} * batch.K);
        veltra_ip_morvik_v1_0_batch_outputs outputs = {};
        outputs.dout = itsDecisions.data();
        outputs.dout_alloc = itsDecisions.size();
        veltra_ip_morvik_v1_0_batch_simulate_i8(itsDecoder.state(),
                                                batch.streams[0].data(),
                                                batch.streams[1].data(),
                                                batch.streams[2].data(),
                                                static_cast<std::int32_t>(batch.K + morvik::rules::tailPositions),
                                                blocks,
                                                morvik::bench::iterations,
                                                nullptr,
                                                &outputs);
    }

    static constexpr unsigned bits = 6120;  // and 24 of the CRC
    static constexpr unsigned blocks = 64;

private:
    static TransportSetting settingOf(Modulation modulation, double rate, int milliEsn0)
    {
        TransportSetting setting;
        setting.bits = bits;
        const unsigned perSymbol = bitsPerSymbol(modulation);
        setting.codedBits = static_cast<unsigned>(bits / rate) / perSymbol * perSymbol;
        setting.symbols = {modulation, Fading::none, Demapper::maxLog, milliEsn0};
        setting.versions = {0};
        setting.scales = {ratioScale(algorithm, modulation, rate)};
        return setting;
    }

    TransportSource itsSource;
    morvik::blocks::Decoder itsDecoder;
    std::vector<unsigned> itsFrames = std::vector<unsigned>(blocks);
    std::vector<std::uint32_t> itsClipped = std::vector<std::uint32_t>(blocks);
    std::array<CodeBlockBatch, 2> itsBatches;
    std::vector<std::uint8_t> itsDecisions;
};

void measureTransportBlocks(const morvik::bench::Options& options)
{
    std::cout << "\nTransport blocks of one code block of 6144 bits, likewise\n\n"
              << "| modulation | rate | instructions | bits, code | symbols, soft values | make, in all | decode | "
                 "make / decode |\n"
              << "|------------|-----:|--------------|-----------:|---------------------:|-------------:|-------:|-----"
                 "---------:|\n";
    struct Line {
        Modulation modulation;
        double rate;
        int milliEsn0;
    };
    for (const SamplerForm& form : samplerForms()) {
        for (const Line& line : {Line{Modulation::qpsk, 1.0 / 3, -1000}, Line{Modulation::qam64, 0.75, 15800}}) {
            TransportStages stages(line.modulation, line.rate, line.milliEsn0, form);
            constexpr double bits = double{TransportStages::bits} * TransportStages::blocks;
            const double begin = cyclesOf(stages, &TransportStages::begin, bits, options);
            const double transmit = cyclesOf(stages, &TransportStages::transmit, bits, options);
            const double make = cyclesOf(stages, &TransportStages::make, bits, options);
            const double decode = cyclesOf(stages, &TransportStages::decode, bits, options);
            std::cout << "| " << std::left << std::setw(10) << nameOf(line.modulation) << " | " << std::right
                      << std::setw(4) << line.rate << " | " << std::left << std::setw(12) << form.name << std::right
                      << " | " << std::setw(10) << begin << " | " << std::setw(20) << transmit << " | " << std::setw(12)
                      << make << " | " << std::setw(6) << decode << " | " << std::setw(11) << 100 * make / decode
                      << " % |\n"
                      << std::flush;
        }
    }
}

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
                const double bits = double{1} * K * count;
                const double encode = cyclesOf(stages, &Stages::encode, bits, options);
                const double receive = cyclesOf(stages, &Stages::receive, bits, options);
                const double make = cyclesOf(stages, &Stages::make, bits, options);
                const double decode = cyclesOf(stages, &Stages::decode, bits, options);
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
        measureTransportBlocks(options);
    } catch (const std::exception& error) {
        std::cerr << "morvik_bench_frames: " << error.what() << '\n';
        return 1;
    }
    return 0;
}

// ChainTrial: decodes transport blocks with mistakes undone, and simulated ones in the same noise.
#include "ChainTrial.h"

#include <algorithm>
#include <array>
#include <cmath>

#include "link/SymbolLink.h"
#include "link/coding/Crc.h"
#include "link/coding/SoftValues.h"
#include "simulation/FrameSimulator.h"

namespace morvik::diagnosis {

namespace {

simulation::LinkFormat linkFormatOf(const ChainFormat& format)
{
    simulation::LinkFormat sent;
    sent.transportBlockSize = format.bits;
    sent.codedBits = format.codedBits;
    sent.modulation = format.modulation;
    sent.versions = format.versions;
    sent.softBufferSize = format.softBufferSize == link::unlimitedBuffer ? 0 : format.softBufferSize;
    return sent;
}

}  // namespace

ChainTrial::ChainTrial(const ChainFormat& format, const DecoderOptions& options, double scale)
    : itsFormat(format),
      itsCode(codingOf(format)),
      itsScale(scale),
      itsIterations(options.iterations),
      itsSilence(nullptr),
      itsDecoder(options.generics, itsSilence),
      itsRow(link::wordsOf(std::size_t{format.bits} + link::crcBits)),
      itsBits(format.bits)
{
}

ChainTrial::Result ChainTrial::decode(const std::vector<ChainCase>& cases, const ChainMistakes& mistakes)
{
    Result result;
    for (const ChainCase& one : cases) {
        result.decoded += decode(one, mistakes) ? 1U : 0U;
        for (std::size_t i = 0; i < one.sent.size(); ++i) {
            result.wrongBits += itsBits[i] != one.sent[i] ? 1U : 0U;
        }
    }
    return result;
}

std::vector<std::uint8_t> ChainTrial::bitsOf(const ChainCase& one, const ChainMistakes& mistakes)
{
    return decode({one.rows, {}}, mistakes) ? itsBits : std::vector<std::uint8_t>{};
}

bool ChainTrial::decode(const ChainCase& one, const ChainMistakes& mistakes)
{
    const link::CodeBlocks& blocks = itsCode.blocks();
    std::vector<std::vector<float>> sums(blocks.count);
    for (std::size_t t = 0; t < one.rows.size(); ++t) {
        for (unsigned r = 0; r < blocks.count; ++r) {
            receive(one, t, mistakes, r, sums[r]);
            decodeBlock(r, sums[r], mistakes);
        }
        link::unpackBits(itsRow.data(), itsBits.size(), itsBits.data());
        if (one.sent.empty() ? itsCode.fits(itsRow.data()) : itsBits == one.sent) {
            return true;
        }
    }
    return false;
}

bool ChainTrial::fitsAtFirst(const ChainCase& one, const ChainMistakes& mistakes)
{
    std::vector<float> sums;
    for (std::size_t t = 0; t < one.rows.size(); ++t) {
        receive(one, t, mistakes, 0, sums);
        if (decodeBlock(0, sums, mistakes)) {
            return true;
        }
    }
    return false;
}

/// Decodes code block r into its part of itsRow. Returns whether its CRC fits.
bool ChainTrial::decodeBlock(unsigned r, const std::vector<float>& sums, const ChainMistakes& mistakes)
{
    itsDecoder.decode(softBlock(r, sums, std::ldexp(itsScale, -mistakes.doublings)), itsIterations, 0, itsDecisions);
    return itsCode.join(itsDecisions.data(), r, itsRow.data());
}

/// Adds a transmission to the soft buffer of code block r: its streams, one after the other.
void ChainTrial::receive(const ChainCase& one,
                         std::size_t transmission,
                         const ChainMistakes& mistakes,
                         unsigned r,
                         std::vector<float>& sums) const
{
    const link::CodeBlocks& blocks = itsCode.blocks();
    const Part part = partsOf(itsCode, mistakes.split)[r];
    const auto first = one.rows[transmission].begin() + static_cast<std::ptrdiff_t>(part.first);
    // Code blocks are sent in whole symbols.
    const std::vector<float> values = restoredSymbols(
        std::vector<float>(first, first + static_cast<std::ptrdiff_t>(part.count)), itsFormat.modulation, mistakes);
    const unsigned version = (mistakes.versions.empty() ? itsFormat.versions : mistakes.versions)[transmission];
    const WholeBuffer whole(blocks.size(r), blocks.fillersOf(r), mistakes);
    const CircularBuffer buffer = whole.limited(bufferSizeOf(itsFormat, mistakes, blocks.count, whole.size()));
    sums.resize(std::size_t{3} * (blocks.size(r) + rules::tailPositions));
    for (std::size_t i = 0; i < values.size() && !buffer.places.empty(); ++i) {
        sums[buffer.places[(buffer.starts.at(version) + i) % buffer.places.size()]] += values[i];
    }
}

/// A code block as the core takes it.
SoftBlock ChainTrial::softBlock(unsigned r, const std::vector<float>& sums, double scale) const
{
    std::vector<std::int8_t> values(sums.size());
    link::softValues(sums.data(), sums.size(), static_cast<float>(scale), values.data());
    const auto length = static_cast<std::ptrdiff_t>(sums.size() / 3);
    const auto first = values.begin();
    SoftBlock block = {
        {first, first + length}, {first + length, first + 2 * length}, {first + 2 * length, values.end()}};
    std::fill_n(block.rsc1Sys.begin(), itsCode.blocks().fillersOf(r), link::fillerValue);
    std::fill_n(block.rsc1Par.begin(), itsCode.blocks().fillersOf(r), link::fillerValue);
    return block;
}

double esn0Of(link::Modulation modulation, double wrongSigns)
{
    constexpr std::size_t bits = 24576;  // whole symbols of each modulation
    std::vector<std::uint64_t> sent(link::wordsOf(bits));
    std::uint64_t word = 1;
    for (std::uint64_t& each : sent) {
        word = word * 6364136223846793005U + 1442695040888963407U;
        each = word ^ word >> 29;
    }
    std::vector<float> ratios(bits);
    int low = -30000;
    int high = 50000;
    while (low + 50 < high) {
        const int middle = (low + high) / 2;
        link::SymbolLink channel({modulation, link::Fading::none, link::Demapper::maxLog, middle},
                                 link::randomKey(1),
                                 link::samplerForms().front());
        channel.receive(0, 0, sent.data(), bits, ratios.data());
        std::size_t wrong = 0;
        for (std::size_t i = 0; i < bits; ++i) {
            wrong += (ratios[i] > 0) != ((sent[i / 64] >> i % 64 & 1) != 0) ? 1U : 0U;
        }
        (static_cast<double>(wrong) > wrongSigns * bits ? low : high) = middle;
    }
    return high / 1000.0;
}

double limitOf(const ChainFormat& format)
{
    return simulation::usualMilliEsn0(linkFormatOf(format), link::codeBlocksOf(format.bits).sizePlus).front() / 1000.0;
}

std::uint32_t simulatedFailures(
    const ChainFormat& format, const DecoderOptions& options, double esn0, double stepsPerRatio, std::uint32_t blocks)
{
    simulation::Sweep sweep;
    sweep.formats = {linkFormatOf(format)};
    sweep.numPus = {static_cast<unsigned>(options.generics.C_NUM_PU)};
    sweep.algorithms = {static_cast<unsigned>(options.generics.C_ALGORITHM_TYPE)};
    const auto milliScale = static_cast<int>(std::lround(std::min(1000 * stepsPerRatio, 1e6)));
    sweep.scaleOptions = {milliScale > 0 ? simulation::ScaleOption(milliScale) : std::nullopt};
    sweep.iterations = {options.iterations};
    sweep.axis = simulation::Axis::esn0;
    sweep.milliDecibels = {static_cast<int>(std::lround(1000 * esn0))};
    simulation::Plan plan;
    plan.points = pointsOf(sweep);
    plan.seed = 1;
    simulation::FrameSimulator simulator(plan, "");
    simulation::BatchResult result = simulator.begin({0, 0, blocks});
    while (simulator.proceed(result)) {
    }
    return static_cast<std::uint32_t>(
        std::count_if(result.wrongBits.begin(), result.wrongBits.end(), [](std::uint32_t wrong) { return wrong > 0; }));
}

}  // namespace morvik::diagnosis

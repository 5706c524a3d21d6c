// The lane-parallel decoder against the component path: every ratio, decision and extrinsic value.
//
// MORVIK_TEST_SEED and MORVIK_TEST_BLOCKS in the environment choose another, longer run.
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "TCalculationEngine.h"
#include "TDecoder3GPU.h"
#include "TInterleaver.h"
#include "TNumberFormat.h"
#include "lanes/InstructionSets.h"
#include "lanes/LaneDecoder.h"
#include "rules/Algorithms.h"
#include "support/Blocks.h"
#include "support/Environment.h"

namespace lanes = morvik::lanes;

namespace {

using morvik::lanes::Algorithm;
using morvik::rules::Cut;

/// 6 eighths up to a magnitude of 63, 4 up to 127, and so on (rule 9), indexed by a quarter of the magnitude in
/// eighths.
constexpr morvik::lanes::CorrectionTable corrections = {6, 4, 3, 2, 1, 1};

/// The component path: one decoder with its formats, interleaver and engine.
struct Components {
    std::unique_ptr<TNumberFormat> state{TNumberFormat::create("Fix_12_3")};
    std::unique_ptr<TNumberFormat> input{TNumberFormat::create("Fix_8_3")};
    std::unique_ptr<TInterleaver> interleaver{TInterleaver::create("3GPPLTE")};
    std::unique_ptr<TCalculationEngine> engine;
    std::unique_ptr<TDecoder3GPU> decoder;

    Components(unsigned units, Algorithm algorithm)
        : engine(TCalculationEngine::create(algorithm == Algorithm::corrected ? "MOD#:16" : "MOD")),
          decoder(static_cast<TDecoder3GPU*>(TDecoder3GPU::create(false, std::to_string(units))))
    {
        engine->itsStateFormat = state.get();
        engine->itsInputFormat = engine->itsBranchFormat = input.get();
        engine->initialise();
        decoder->itsInterleaver = interleaver.get();
        decoder->itsEngine = engine.get();
        decoder->itsExtrinsicScale = morvik::rules::extrinsicScale(static_cast<int>(algorithm));
    }
};

std::vector<short> alignedSoftValues(const morvik::blocks::Block& block)
{
    std::vector<short> soft;
    for (std::size_t i = 0; i < block.sys.size(); ++i) {
        for (const morvik::blocks::Stream* stream : {&block.sys, &block.par1, &block.par2}) {
            soft.push_back(static_cast<short>(16 * (*stream)[i]));
        }
    }
    return soft;
}

/// What a pass leaves, in the order of its constituent decoder.
struct Results {
    std::vector<std::int16_t> ratios;
    std::vector<std::int16_t> joint;
    std::vector<std::uint8_t> decisions;

    explicit Results(std::size_t K = 0) : ratios(K), joint(K), decisions(K) {}
};

/// The results of every pass of the component path, in turn.
std::vector<Results> componentResults(Components& components, const morvik::blocks::Block& block, unsigned passes)
{
    TDecoder3GPU& decoder = *components.decoder;
    EXPECT_TRUE(decoder.extract(alignedSoftValues(block)));
    const std::size_t K = block.sys.size() - 4;
    std::vector<Results> all;
    for (unsigned h = 0; h < passes; ++h) {
        EXPECT_TRUE(decoder.calcSISO(h));
        Results results(K);
        for (std::size_t k = 0; k < K; ++k) {
            results.ratios[k] = decoder.itsLLR[k];
            results.decisions[k] = decoder.itsLLR[k] >= 0 ? 1 : 0;
            const int half = (decoder.itsExtrinsic[k] / 2) & ~15;
            results.joint[k] = static_cast<std::int16_t>(half + decoder.itsSys[h % 2 == 0 ? 1 : 0][k]);
        }
        all.push_back(results);
    }
    return all;
}

/// Decodes the blocks, as many at once as the decoder likes, but at most `most`.
std::vector<Results> laneResults(lanes::LaneDecoder& decoder,
                                 const std::vector<morvik::blocks::Block>& blocks,
                                 unsigned passes,
                                 std::size_t most)
{
    std::vector<morvik::lanes::Streams<std::int32_t>> streams;
    streams.reserve(blocks.size());
    std::vector<Results> all(blocks.size(), Results(decoder.cut().K()));
    for (const morvik::blocks::Block& block : blocks) {
        streams.push_back({block.sys.data(), block.par1.data(), block.par2.data()});
    }
    for (std::size_t first = 0; first < blocks.size();) {
        const auto rest = static_cast<unsigned>(std::min(most, blocks.size() - first));
        const unsigned taken = decoder.blocksTaken(rest);
        EXPECT_TRUE(decoder.load(&streams[first], rest));
        decoder.decode(0, passes);
        std::vector<std::uint8_t*> decisions;
        std::vector<std::int16_t*> ratios;
        std::vector<std::int16_t*> joint;
        for (std::size_t i = first; i < first + taken; ++i) {
            decisions.push_back(all[i].decisions.data());
            ratios.push_back(all[i].ratios.data());
            joint.push_back(all[i].joint.data());
        }
        decoder.decisions(decisions.data());
        decoder.ratios(ratios.data());
        decoder.joint(joint.data());
        first += taken;
    }
    return all;
}

std::string nameOf(Algorithm algorithm)
{
    return "type " + std::to_string(static_cast<int>(algorithm));
}

class LaneDecoder : public testing::TestWithParam<const morvik::lanes::InstructionSet*> {
protected:
    /// The lanes of the widest row.
    static unsigned lanesOfRow()
    {
        return GetParam()->kernels[GetParam()->kernelCount - 1].lanes;
    }

    /// Decodes the blocks in lanes and by components, and compares every value of every pass.
    static void compare(unsigned K,
                        unsigned units,
                        Algorithm algorithm,
                        const std::vector<morvik::blocks::Block>& blocks,
                        unsigned passes)
    {
        Components components(units, algorithm);
        lanes::LaneDecoder decoder(*GetParam(), algorithm, corrections);
        decoder.setCut(Cut(K, units));
        std::vector<std::vector<Results>> expected;
        expected.reserve(blocks.size());
        for (const morvik::blocks::Block& block : blocks) {
            expected.push_back(componentResults(components, block, passes));
        }
        for (unsigned h = 1; h <= passes; ++h) {
            expectSame(expected, h, laneResults(decoder, blocks, h, blocks.size()));
            // Alone, blocks of a single segment meet another kernel.
            if (!testing::Test::HasFatalFailure() && decoder.cut().segments() == 1) {
                expectSame(expected, h, laneResults(decoder, blocks, h, 1));
            }
            ASSERT_FALSE(testing::Test::HasFatalFailure())
                << "K " << K << ", " << units << " units, " << nameOf(algorithm) << ", passes " << h;
        }
    }

    static void expectSame(const std::vector<std::vector<Results>>& expected,
                           unsigned passes,
                           const std::vector<Results>& got)
    {
        for (std::size_t i = 0; i < got.size(); ++i) {
            SCOPED_TRACE("block " + std::to_string(i));
            ASSERT_EQ(got[i].ratios, expected[i][passes - 1].ratios);
            ASSERT_EQ(got[i].joint, expected[i][passes - 1].joint);
            ASSERT_EQ(got[i].decisions, expected[i][passes - 1].decisions);
        }
    }

    /// A block of each kind, with each number of units and each algorithm type.
    static void compareRandomBlocks(const std::vector<unsigned>& sizes);
};

constexpr Algorithm algorithms[] = {Algorithm::greatest, Algorithm::greatestScaled, Algorithm::corrected};

void forEachStream(morvik::blocks::Block& block, const std::function<void(morvik::blocks::Stream&)>& change)
{
    for (morvik::blocks::Stream* stream : {&block.sys, &block.par1, &block.par2}) {
        change(*stream);
    }
}

morvik::blocks::Block clipped(morvik::blocks::Block block)
{
    forEachStream(block, [](morvik::blocks::Stream& stream) {
        for (std::int32_t& value : stream) {
            value = std::min(127, std::max(-128, value));
        }
    });
    return block;
}

/// Uniform, extreme and small values, a code word with noise, and one that saturates.
constexpr unsigned kinds = 5;

morvik::blocks::Block blockOf(morvik::blocks::Random& random, unsigned K, unsigned kind)
{
    if (kind >= 3) {
        morvik::blocks::Block block =
            morvik::blocks::encode(morvik::blocks::randomBits(random, K), kind == 3 ? 8 : 100);
        morvik::blocks::addNoise(random, kind == 3 ? 8 : 60, block);
        return clipped(block);
    }
    const morvik::blocks::Values values[] = {
        morvik::blocks::Values::uniform, morvik::blocks::Values::extreme, morvik::blocks::Values::small};
    return morvik::blocks::randomBlock(random, K, values[kind]);
}

void LaneDecoder::compareRandomBlocks(const std::vector<unsigned>& sizes)
{
    morvik::blocks::Random random(1);
    for (const unsigned K : sizes) {
        for (const unsigned units : {2U, 4U, 8U}) {
            for (const Algorithm algorithm : algorithms) {
                std::vector<morvik::blocks::Block> blocks;
                for (unsigned kind = 0; kind < kinds; ++kind) {
                    blocks.push_back(blockOf(random, K, kind));
                }
                ASSERT_NO_FATAL_FAILURE(compare(K, units, algorithm, blocks, 5));
            }
        }
    }
}

/// Each value as one of the format's extremes, by its sign.
morvik::blocks::Block extremes(morvik::blocks::Block block)
{
    forEachStream(block, [](morvik::blocks::Stream& stream) {
        for (std::int32_t& value : stream) {
            value = value >= 0 ? 127 : -128;
        }
    });
    return block;
}

/// Turns the signs of some streams' values, of all positions or of the tail alone.
morvik::blocks::Block turned(morvik::blocks::Block block, unsigned streams, bool tailAlone)
{
    unsigned bit = 1;
    forEachStream(block, [&](morvik::blocks::Stream& stream) {
        if ((streams & bit) != 0) {
            const auto first = tailAlone ? stream.end() - 4 : stream.begin();
            std::transform(first, stream.end(), first, [](std::int32_t value) { return -1 - value; });
        }
        bit *= 2;
    });
    return block;
}

/// Bits that repeat after `period` positions.
std::vector<int> periodicBits(unsigned K, unsigned period, unsigned pattern)
{
    std::vector<int> bits;
    for (unsigned k = 0; k < K; ++k) {
        bits.push_back(static_cast<int>(pattern >> k % period & 1U));
    }
    return bits;
}

/// Extremes whose signs repeat in each stream, whatever a code word would have there.
morvik::blocks::Block periodicBlock(unsigned K, unsigned period, const std::array<unsigned, 3>& patterns)
{
    morvik::blocks::Block block;
    unsigned s = 0;
    forEachStream(block, [&](morvik::blocks::Stream& stream) {
        for (const int bit : periodicBits(K + 4, period, patterns[s])) {
            stream.push_back(bit != 0 ? 127 : -128);
        }
        ++s;
    });
    return block;
}

/// Blocks that drive metrics apart: saturated code words, with streams against what the code wants, in the
/// whole block or in the tail alone, and extremes that repeat after 1 to 7 positions (the encoder's register
/// repeats after 7).
std::vector<morvik::blocks::Block> worstBlocks(morvik::blocks::Random& random, unsigned K)
{
    std::vector<morvik::blocks::Block> worst;
    for (unsigned streams = 0; streams < 8; ++streams) {
        for (const bool tailAlone : {false, true}) {
            worst.push_back(
                turned(extremes(morvik::blocks::encode(morvik::blocks::randomBits(random, K), 1)), streams, tailAlone));
        }
    }
    for (unsigned period = 1; period <= 7; ++period) {
        const auto pattern = [&] {
            return static_cast<unsigned>(random() % (1U << period));
        };
        worst.push_back(turned(extremes(morvik::blocks::encode(periodicBits(K, period, pattern()), 1)), 0, false));
        worst.push_back(turned(extremes(morvik::blocks::encode(periodicBits(K, period, 1), 1)),
                               static_cast<unsigned>(random() % 8),
                               true));
        worst.push_back(periodicBlock(K, period, {pattern(), pattern(), pattern()}));
    }
    for (unsigned signs = 0; signs < 8; ++signs) {
        worst.push_back(periodicBlock(K, 1, {signs & 1U, signs >> 1 & 1U, signs >> 2}));
    }
    return worst;
}

/// Ties: all values alike, and small, or 0 but for one.
std::vector<morvik::blocks::Block> tiedBlocks(morvik::blocks::Random& random, unsigned K)
{
    std::vector<morvik::blocks::Block> tied;
    for (const std::int32_t value : {0, 1, -1}) {
        const morvik::blocks::Stream stream(K + 4, value);
        tied.push_back({stream, stream, stream});
    }
    morvik::blocks::Block block = tied[0];
    block.par1[random() % (K + 4)] = 127;
    tied.push_back(block);
    block.sys[random() % (K + 4)] = -128;
    tied.push_back(block);
    return tied;
}

/// The numbers of blocks at a row's edges: one, the row full, one more, and others that leave lanes over.
std::vector<unsigned> batchSizes(unsigned capacity)
{
    return {1, capacity, capacity + 1, 3, 2 * capacity + 1};
}

TEST_P(LaneDecoder, EveryValueOfEveryPassIsThatOfTheComponents)
{
    compareRandomBlocks({256, 504, 512, 1024, 1056, 2048, 2112, 3136, 6080, 6144});
}

/// scripts/mutate runs these first.
TEST_P(LaneDecoder, EveryValueOfShortBlocksIsThatOfTheComponents)
{
    compareRandomBlocks({40, 48, 64, 120, 128, 136});
}

TEST_P(LaneDecoder, WorstBlocksAreDecodedAlike)
{
    morvik::blocks::Random random(2);
    for (const unsigned K : {40U, 48U, 56U, 128U, 512U, 1056U, 6144U}) {
        for (const Algorithm algorithm : algorithms) {
            std::vector<morvik::blocks::Block> blocks = worstBlocks(random, K);
            if (K > 1024) {
                blocks.resize(16);
            }
            ASSERT_NO_FATAL_FAILURE(compare(K, K > 1024 ? 8 : 2, algorithm, blocks, K > 1024 ? 3 : 6));
        }
    }
}

TEST_P(LaneDecoder, TiesAreDecodedAlike)
{
    morvik::blocks::Random random(3);
    for (const unsigned K : {40U, 48U, 264U, 2048U}) {
        for (const Algorithm algorithm : algorithms) {
            ASSERT_NO_FATAL_FAILURE(compare(K, 4, algorithm, tiedBlocks(random, K), 6));
        }
    }
}

/// Beside 127 and -128 alone, which leave no bit that could hide it.
template <class Input>
void expectEachNoticed(const morvik::lanes::InstructionSet& instructionSet, unsigned K, Input beyond)
{
    lanes::LaneDecoder decoder(instructionSet, Algorithm::greatest, corrections);
    decoder.setCut(Cut(K, 2));
    for (const Input within : {Input{-128}, Input{127}}) {
        std::vector<Input> values(3 * (K + 4), within);
        const morvik::lanes::Streams<Input> streams = {&values[0], &values[K + 4], &values[2 * (K + 4)]};
        EXPECT_TRUE(decoder.load(&streams, 1));
        for (Input& value : values) {
            value = beyond;
            EXPECT_FALSE(decoder.load(&streams, 1)) << int{beyond} << " at " << &value - values.data();
            value = within;
        }
    }
}

TEST_P(LaneDecoder, EachValueBeyondTheFormatIsNoticed)
{
    for (const unsigned K : {40U, 136U}) {  // of one segment and of two
        for (const std::int16_t beyond : std::vector<std::int16_t>{128, -129, 32767, -32768}) {
            expectEachNoticed<std::int32_t>(*GetParam(), K, beyond);
            expectEachNoticed<std::int16_t>(*GetParam(), K, beyond);
        }
        expectEachNoticed<std::int32_t>(*GetParam(), K, 32768);
        expectEachNoticed<std::int32_t>(*GetParam(), K, -32769);
    }
}

/// The components are slow in builds without optimisation and with sanitizers: there, a sample has to do, of which each
/// instruction set takes another part.
#ifdef MORVIK_SLOW_COMPONENTS
constexpr unsigned combinationsPerOneTaken = 67;
#else
constexpr unsigned combinationsPerOneTaken = 1;
#endif

/// Each block size with each number of units and each algorithm type, each of them with another number of
/// blocks and passes. MORVIK_TEST_BLOCKS, from 40 on, asks for all numbers of blocks with all of them.
TEST_P(LaneDecoder, EveryBlockSizeIsDecodedAlike)
{
    const unsigned seed = fromEnvironment("MORVIK_TEST_SEED", 4);
    const bool all = fromEnvironment("MORVIK_TEST_BLOCKS", 0) >= 40;
    const auto sets = morvik::lanes::availableInstructionSets();
    const auto ofThis = static_cast<unsigned>(std::find(sets.begin(), sets.end(), GetParam()) - sets.begin());
    const unsigned part = ofThis * combinationsPerOneTaken / static_cast<unsigned>(sets.size());
    morvik::blocks::Random random(seed);
    unsigned turn = seed;
    for (const unsigned K : morvik::blocks::blockSizes()) {
        for (const unsigned units : {2U, 4U, 8U}) {
            const unsigned capacity = std::max(1U, lanesOfRow() / Cut(K, units).segments());
            for (const Algorithm algorithm : algorithms) {
                if (!all && (turn + part) % combinationsPerOneTaken != 0) {
                    ++turn;
                    continue;
                }
                const std::vector<unsigned> sizes = batchSizes(capacity);
                for (std::size_t i = 0; i < sizes.size(); ++i) {
                    if (!all && i != turn % sizes.size()) {
                        continue;
                    }
                    std::vector<morvik::blocks::Block> blocks;
                    for (unsigned b = 0; b < sizes[i]; ++b) {
                        blocks.push_back(blockOf(random, K, (b + turn) % kinds));
                    }
                    ASSERT_NO_FATAL_FAILURE(compare(K, units, algorithm, blocks, all ? 4 : 2 + turn % 2));
                }
                ++turn;
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(InstructionSets,
                         LaneDecoder,
                         testing::ValuesIn(morvik::lanes::availableInstructionSets()),
                         [](const auto& set) { return std::string(set.param->name); });

}  // namespace

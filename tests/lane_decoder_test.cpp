// The lane-parallel decoder against the component path: every ratio, decision and extrinsic value.
#include <gtest/gtest.h>

#include <cstdlib>
#include <memory>
#include <ostream>
#include <string>
#include <tuple>
#include <vector>

#include "../lanes/InstructionSets.h"
#include "../lanes/LaneDecoder.h"
#include "Segmentation.h"
#include "TCalculationEngine.h"
#include "TDecoder3GPU.h"
#include "TInterleaver.h"
#include "TNumberFormat.h"
#include "support/Blocks.h"

namespace {

using lanes::Algorithm;
using lanes::LaneDecoder;

/// 6 steps up to a magnitude of 63, 4 up to 127, and so on (rule 9), by quarters of a magnitude in steps.
constexpr lanes::CorrectionTable corrections = {6, 4, 3, 2, 1, 1};

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
        decoder->itsExtrinsicScale = algorithm == Algorithm::greatestScaled ? 0.75 : 1.0;
    }
};

lanes::BlockCut cutOf(unsigned K, unsigned units, const TInterleaver& interleaver)
{
    lanes::BlockCut cut;
    cut.blockSize = K;
    cut.segments = segmentation::segmentCount(K, 4 * units);
    cut.windowStart = segmentation::windowStarts(K / cut.segments);
    interleaver.calcInterleaver(cut.permutation, K);
    return cut;
}

std::vector<short> alignedSoftValues(const blocks::Block& block)
{
    std::vector<short> soft;
    for (std::size_t i = 0; i < block.sys.size(); ++i) {
        for (const blocks::Stream* stream : {&block.sys, &block.par1, &block.par2}) {
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
std::vector<Results> componentResults(Components& components, const blocks::Block& block, unsigned passes)
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

/// Decodes the blocks, as many at once as the decoder likes.
std::vector<Results> laneResults(LaneDecoder& decoder, const std::vector<blocks::Block>& blocks, unsigned passes)
{
    std::vector<lanes::Streams<std::int32_t>> streams;
    std::vector<Results> all(blocks.size(), Results(decoder.blockCut().blockSize));
    for (const blocks::Block& block : blocks) {
        streams.push_back({block.sys.data(), block.par1.data(), block.par2.data()});
    }
    for (std::size_t first = 0; first < blocks.size();) {
        const auto rest = static_cast<unsigned>(blocks.size() - first);
        const unsigned taken = decoder.blocksTaken(rest);
        EXPECT_TRUE(decoder.load(&streams[first], rest));
        decoder.decode(passes);
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

class LaneDecoderTest : public testing::TestWithParam<const lanes::InstructionSet*> {};

blocks::Block blockOf(blocks::Random& random, unsigned K, unsigned kind)
{
    if (kind == 0) {
        blocks::Block block = blocks::encode(blocks::randomBits(random, K), 8);
        blocks::addNoise(random, 8, block);
        for (blocks::Stream* stream : {&block.sys, &block.par1, &block.par2}) {
            for (std::int32_t& value : *stream) {
                value = std::min(127, std::max(-128, value));
            }
        }
        return block;
    }
    const blocks::Values values[] = {blocks::Values::uniform, blocks::Values::extreme, blocks::Values::small};
    return blocks::randomBlock(random, K, values[kind - 1]);
}

TEST_P(LaneDecoderTest, EveryValueOfEveryPassIsThatOfTheComponents)
{
    blocks::Random random(1);
    for (const unsigned K :
         {40U, 48U, 120U, 128U, 136U, 256U, 504U, 512U, 1024U, 1056U, 2048U, 2112U, 3136U, 6080U, 6144U}) {
        for (const unsigned units : {2U, 4U, 8U}) {
            for (const Algorithm algorithm : {Algorithm::greatest, Algorithm::greatestScaled, Algorithm::corrected}) {
                Components components(units, algorithm);
                LaneDecoder decoder(*GetParam(), algorithm, corrections);
                decoder.setBlockCut(cutOf(K, units, *components.interleaver));
                const unsigned passes = 5;
                std::vector<blocks::Block> blocks;
                for (unsigned i = 0; i < 4; ++i) {
                    blocks.push_back(blockOf(random, K, i));
                }
                std::vector<std::vector<Results>> expected;
                for (const blocks::Block& block : blocks) {
                    expected.push_back(componentResults(components, block, passes));
                }
                for (unsigned h = 1; h <= passes; ++h) {
                    const std::vector<Results> got = laneResults(decoder, blocks, h);
                    for (std::size_t i = 0; i < blocks.size(); ++i) {
                        SCOPED_TRACE("K " + std::to_string(K) + ", " + std::to_string(units) + " units, " +
                                     nameOf(algorithm) + ", kind " + std::to_string(i) + ", passes " +
                                     std::to_string(h));
                        ASSERT_EQ(got[i].ratios, expected[i][h - 1].ratios);
                        ASSERT_EQ(got[i].joint, expected[i][h - 1].joint);
                        ASSERT_EQ(got[i].decisions, expected[i][h - 1].decisions);
                    }
                }
            }
        }
    }
}

INSTANTIATE_TEST_SUITE_P(InstructionSets,
                         LaneDecoderTest,
                         testing::ValuesIn(lanes::availableInstructionSets()),
                         [](const auto& set) { return std::string(set.param->name); });

}  // namespace

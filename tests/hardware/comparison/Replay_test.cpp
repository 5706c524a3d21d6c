// Replay: the model's own values follow from each other, and a mistake gives other ones.
#include "hardware/comparison/Replay.h"

#include <gtest/gtest.h>

#include <iostream>
#include <string>

#include "hardware/comparison/Comparison.h"
#include "hardware/comparison/Patterns.h"
#include "support/Blocks.h"

namespace morvik::comparison {
namespace {

using morvik::signalCount;
using morvik::signalsOf;
using morvik::Stage;

morvik::SoftBlock noisyBlock(unsigned K, unsigned seed)
{
    morvik::blocks::Random random(seed);
    morvik::blocks::Block block = morvik::blocks::encode(morvik::blocks::randomBits(random, K), 16);
    morvik::blocks::addNoise(random, 14, block);
    return {block.sys, block.par1, block.par2};
}

Model modelOf(unsigned K, int units, int algorithm, unsigned iterations, unsigned seed = 1)
{
    auto generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = units;
    generics.C_ALGORITHM_TYPE = algorithm;
    return computeModel(noisyBlock(K, seed), generics, iterations, std::cerr);
}

/// Sizes of one segment and of several, with one, two, three and more windows in each.
class ModelValues : public testing::TestWithParam<unsigned> {};

TEST_P(ModelValues, FollowFromEachOther)
{
    for (const int units : {2, 4, 8}) {
        for (const int algorithm : {0, 1, 2}) {
            const Model model = modelOf(GetParam(), units, algorithm, 3);
            const Comparison comparison = compare(model, model.values);
            EXPECT_FALSE(comparison.first);
            EXPECT_EQ(comparison.allFaults(), 0U) << units << ' ' << algorithm;
            // K + 3 intrinsic values, K + 1 forward columns, and K of the others.
            EXPECT_EQ(comparison.compared(), 6U * (GetParam() * 23U + 3 + 8));
        }
    }
}

INSTANTIATE_TEST_SUITE_P(Sizes, ModelValues, testing::Values(40U, 72U, 128U, 192U, 512U, 1088U, 2560U, 6144U));

TEST(Replay, TellsAWrongValueFromItsConsequences)
{
    const Model model = modelOf(512, 2, 1, 2);
    Values dump = model.values;
    const Place wrong = {1, signalsOf(Stage::ratio).first, 77};
    dump.set(wrong, static_cast<std::int16_t>(dump.at(wrong) ^ 8));
    // What follows from it, as hardware would compute it.
    const Replay replay(model, dump);
    dump.set({1, signalsOf(Stage::extrinsic).first, 77}, replay.column(1, Stage::extrinsic, 77).values[0]);
    dump.set({2, 0, 0}, model.values.at({2, 0, 0}));

    const Comparison comparison = compare(model, dump);
    ASSERT_TRUE(comparison.first);
    EXPECT_EQ(comparison.first->pass, 1U);
    EXPECT_EQ(comparison.first->step, 77U);
    ASSERT_FALSE(comparison.faults.empty());
    EXPECT_EQ(comparison.faults.front().got, dump.at(wrong));
    EXPECT_EQ(comparison.faults.front().wanted, model.values.at(wrong));
    EXPECT_EQ(comparison.signals[signalsOf(Stage::extrinsic).first].faults, 0U);
    ASSERT_EQ(comparison.inputs.size(), 3U);
    for (const InputState& input : comparison.inputs) {
        EXPECT_EQ(input.different, 0U);
        EXPECT_EQ(input.step, 77U);
    }
}

TEST(Replay, TakesTheModelsValueForAnInputThatIsNotInTheDump)
{
    const Model model = modelOf(40, 2, 1, 1);
    Values dump(model.values.passes(), model.values.steps());
    const Place ratio = {0, signalsOf(Stage::ratio).first, 3};
    dump.set(ratio, model.values.at(ratio));
    const Column column = Replay(model, dump).column(0, Stage::ratio, 3);
    EXPECT_FALSE(column.sources.complete);
    EXPECT_EQ(column.values[0], model.values.at(ratio));
}

TEST(Replay, GivesWhatMistakesGive)
{
    const Model model = modelOf(512, 8, 1, 3);
    const Replay replay(model, model.values);
    // The start column of segment 1 in its second pass, with the bits that a border loses.
    const Column kept = replay.column(2, Stage::forward, 64, {Mistake::borderMask, -1});
    const Column cleared = replay.column(2, Stage::forward, 64);
    EXPECT_NE(kept.values, cleared.values);
    for (unsigned state = 0; state < 8; ++state) {
        EXPECT_EQ(kept.values[state] & ~7, cleared.values[state]) << state;
    }
    EXPECT_EQ(replay.column(2, Stage::forward, 64, Mistake::borderUnknown).values, Column().values);
}

TEST(Patterns, FindNoShiftOfValuesThatAreAlikeInAllPasses)
{
    morvik::blocks::Random random(1);
    const morvik::blocks::Block block = morvik::blocks::encode(morvik::blocks::randomBits(random, 128), 60);
    auto generics = veltra_ip_morvik_v1_0_get_default_generics();
    const Model model = computeModel({block.sys, block.par1, block.par2}, generics, 8, std::cerr);
    Values dump = model.values;
    for (const unsigned pass : {0U, 1U, 2U}) {
        for (unsigned signal = 0; signal < signalCount; ++signal) {
            for (unsigned step = 0; step < 128; ++step) {
                dump.set({pass, signal, step}, 5);
            }
        }
    }
    // As many values are those of two passes before as are right.
    EXPECT_TRUE(findShifts(model, dump).empty());
}

TEST(Patterns, FindADumpThatIsLate)
{
    const Model model = modelOf(128, 2, 1, 4);
    Values dump(model.values.passes(), model.values.steps());
    for (unsigned pass = 1; pass < dump.passes(); ++pass) {
        for (unsigned step = 0; step < 128; ++step) {
            dump.set({pass, signalsOf(Stage::ratio).first, step},
                     model.values.at({pass - 1, signalsOf(Stage::ratio).first, step}));
        }
    }
    const auto found = findShifts(model, dump);
    ASSERT_EQ(found.size(), 1U);
    EXPECT_EQ(found.front().find("the dump is a pass late, or counts half-iterations from 1"), 0U) << found.front();
}

TEST(Model, OrdersTheStepsOfAllSegmentsTogether)
{
    const Model model = modelOf(512, 8, 1, 1);
    const auto forward = stepsInOrder(model.cut, Stage::forward);
    ASSERT_EQ(forward.size(), 513U);
    EXPECT_EQ(forward[0], 0U);
    EXPECT_EQ(forward[1], 64U);
    EXPECT_EQ(forward[8], 1U);
    EXPECT_EQ(forward[512], 512U);
    const auto backward = stepsInOrder(model.cut, Stage::backward);
    ASSERT_EQ(backward.size(), 512U);
    EXPECT_EQ(backward[0], 63U);
    EXPECT_EQ(backward[1], 127U);
    EXPECT_EQ(backward[8], 62U);
}

}  // namespace
}  // namespace morvik::comparison

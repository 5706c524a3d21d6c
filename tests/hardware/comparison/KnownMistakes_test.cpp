// KnownMistakes: each mistake is named where all values have it, and not where right ones contradict it.
#include "hardware/comparison/KnownMistakes.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <iostream>
#include <string>
#include <vector>

#include "hardware/comparison/Comparison.h"
#include "hardware/comparison/Patterns.h"
#include "hardware/comparison/Replay.h"
#include "support/Blocks.h"

namespace morvik::comparison {
namespace {

using morvik::Stage;
namespace blocks = morvik::blocks;

Model modelOf(unsigned K, int algorithm, int amplitude)
{
    blocks::Random random(1);
    blocks::Block block = blocks::encode(blocks::randomBits(random, K), amplitude);
    blocks::addNoise(random, 14, block);
    auto generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_ALGORITHM_TYPE = algorithm;
    return computeModel({block.sys, block.par1, block.par2}, generics, 2, std::cerr);
}

/// The steps of a stage, those that others start from first, as a core with one thread computes them.
std::vector<unsigned> stepsOneByOne(const Model& model, Stage stage)
{
    std::vector<unsigned> steps = stepsInOrder(model.cut, stage);
    std::sort(steps.begin(), steps.end());
    if (stage == Stage::backward) {
        std::reverse(steps.begin(), steps.end());
    }
    return steps;
}

/// The dump of a core that makes a mistake in each operation that is chosen by its stage.
template <class Choose>
Values dumpWith(const Model& model, const Mistake& mistake, Choose isChosen)
{
    Values dump = model.values;
    const Replay replay(model, dump);
    for (unsigned pass = 0; pass < dump.passes(); ++pass) {
        for (const Stage stage : morvik::stages) {
            const auto [first, count] = morvik::signalsOf(stage);
            for (const unsigned step : stepsOneByOne(model, stage)) {
                const Column column = replay.column(pass, stage, step, isChosen(stage) ? mistake : Mistake());
                for (unsigned i = 0; i < count && !column.sources.open; ++i) {
                    dump.set({pass, first + i, step}, column.values[i]);
                }
            }
        }
    }
    return dump;
}

/// What is found in a stage; nothing if it has no faults.
std::optional<Finding> findingIn(const Model& model, const Values& dump, Stage stage)
{
    const Comparison comparison = compare(model, dump);
    for (const Finding& finding : findPatterns(model, dump, comparison)) {
        if (finding.stage == stage) {
            return finding;
        }
    }
    return std::nullopt;
}

bool names(const Finding& finding, const std::string& text)
{
    return std::find(finding.how.begin(), finding.how.end(), text) != finding.how.end();
}

std::string textOf(const Finding& finding)
{
    std::string text;
    for (const std::string& each : finding.how) {
        text += each + "; ";
    }
    return text + finding.shared + " " + finding.where + " " + std::to_string(finding.faults);
}

/// Expects each mistake of a stage that shows in a block to be named, and not where half of the values contradict it.
void expectNamed(Stage stage, int algorithm)
{
    constexpr std::size_t fewest = 12;
    const Model model = modelOf(256, algorithm, 48);
    blocks::Random random(7);
    std::size_t named = 0;
    for (const KnownMistake& each : knownMistakes(model, stage)) {
        const auto isWrong = [&](Stage asked) {
            return asked == stage || each.reach == Candidate::core;
        };
        const Values all = dumpWith(model, each.mistake, isWrong);
        const auto found = findingIn(model, all, stage);
        if (!found || found->faults < fewest) {
            continue;
        }
        if (each.rank == Candidate::telling) {
            EXPECT_TRUE(names(*found, each.text)) << each.text << "\n" << textOf(*found);
            ++named;
        }
        const Values some =
            dumpWith(model, each.mistake, [&](Stage asked) { return isWrong(asked) && random() % 2 == 0; });
        const auto half = findingIn(model, some, stage);
        if (half && half->faults < found->faults) {
            const bool isElsewhere = half->where != found->where;  // "in half-iteration 3 alone" is true then
            EXPECT_FALSE(names(*half, each.text) && !isElsewhere) << each.text << "\n" << textOf(*half);
        }
    }
    EXPECT_GE(named, 8U);
}

class Mistakes : public testing::TestWithParam<Stage> {};

TEST_P(Mistakes, AreNamedUnlessARightValueContradictsThem)
{
    expectNamed(GetParam(), 1);
}

TEST_P(Mistakes, AreNamedInACoreWithATable)
{
    expectNamed(GetParam(), 2);
}

INSTANTIATE_TEST_SUITE_P(Stages, Mistakes, testing::ValuesIn(morvik::stages), [](const auto& each) {
    return morvik::nameOf(each.param);
});

/// A core whose values of a stage are garbage at some steps.
TEST_P(Mistakes, AreNotNamedForGarbage)
{
    for (const int algorithm : {0, 1, 2}) {
        const Model model = modelOf(256, algorithm, 16);
        for (const unsigned one : {1U, 5U, 40U}) {
            blocks::Random random(one);
            Values dump = model.values;
            const auto [first, count] = morvik::signalsOf(GetParam());
            for (unsigned step = 0; step < model.cut.K(); ++step) {
                const Place place = {3, first + static_cast<unsigned>(random() % count), step};
                if (random() % one == 0) {
                    dump.set(place, static_cast<std::int16_t>(static_cast<int>(random() % 256) - 128));
                }
            }
            const auto found = findingIn(model, dump, GetParam());
            EXPECT_TRUE(found && found->how.empty()) << algorithm << ' ' << one << ' ' << textOf(*found);
        }
    }
}

TEST(Places, AreNotToldByBitsThatNeighboursShare)
{
    const Model model = modelOf(256, 1, 16);
    const unsigned ratio = morvik::signalsOf(Stage::ratio).first;
    Values dump = model.values;
    const auto expectFound = [&](const std::string& where) {
        const auto found = findingIn(model, dump, Stage::ratio);
        ASSERT_TRUE(found);
        EXPECT_EQ(found->where, "in half-iteration 3 alone, " + where + " alone");
    };
    for (const unsigned step : {100U, 101U, 102U}) {
        dump.set({3, ratio, step}, 1000);
    }
    expectFound("in segment 1");
    dump = model.values;
    for (const unsigned step : {37U, 101U, 165U, 229U}) {
        dump.set({3, ratio, step}, 1000);
    }
    expectFound("at steps 37 + 64 n");
}

TEST(FittedMistakes, TakeTheSimplestFactorThatFits)
{
    const Model model = modelOf(256, 1, 16);
    for (const int number : {32, 33}) {
        const Values dump =
            dumpWith(model, {Mistake::scaledBy, number}, [](Stage stage) { return stage == Stage::extrinsic; });
        const auto found = findingIn(model, dump, Stage::extrinsic);
        ASSERT_TRUE(found);
        const std::vector<std::string> expected = {number == 32 ? "the factor is 0.5, not 0.75 (rule 14)"
                                                                : "the factor is 0.515625, not 0.75 (rule 14)"};
        EXPECT_EQ(found->how, expected);
    }
}

/// A value of a signal in all passes, as tables have it.
void setAll(Values& dump, unsigned signal, unsigned step, std::int16_t value)
{
    for (unsigned pass = 0; pass < dump.passes(); ++pass) {
        dump.set({pass, signal, step}, value);
    }
}

TEST(Shifts, AreNotToldByValuesThatAreTheSameEverywhere)
{
    const blocks::Block block = blocks::encode(std::vector<int>(40), 0);
    const Model model =
        computeModel({block.sys, block.par1, block.par2}, veltra_ip_morvik_v1_0_get_default_generics(), 2, std::cerr);
    Values dump = model.values;
    for (unsigned signal = 0; signal < morvik::signalCount; ++signal) {
        for (unsigned step = 40; step < dump.steps(); ++step) {
            setAll(dump, signal, step, 0);
        }
    }
    setAll(dump, morvik::signalsOf(Stage::forward).first + 3, 3, -1024);
    EXPECT_EQ(findShifts(model, dump), std::vector<std::string>());
}

TEST(FittedMistakes, TellTheMetricsOfKnownStates)
{
    const Model model = modelOf(256, 1, 16);
    Values dump = model.values;
    for (unsigned state = 1; state < 8; ++state) {
        setAll(dump, morvik::signalsOf(Stage::forward).first + state, 0, -2048);
    }
    const auto found = findingIn(model, dump, Stage::forward);
    ASSERT_TRUE(found);
    EXPECT_TRUE(names(*found, "states other than 0 start with -2048, not with -1024 (rule 10)")) << textOf(*found);
}

TEST(FittedMistakes, TellAConstant)
{
    const Model model = modelOf(256, 1, 16);
    const unsigned ratio = morvik::signalsOf(Stage::ratio).first;
    for (const int offset : {-3, 5}) {
        Values dump = model.values;
        for (unsigned step = 0; step < model.cut.K(); ++step) {
            dump.set({3, ratio, step}, static_cast<std::int16_t>(model.values.at({3, ratio, step}) + offset));
        }
        const auto found = findingIn(model, dump, Stage::ratio);
        ASSERT_TRUE(found);
        const std::vector<std::string> expected = {"a constant of " + std::to_string(offset) + " is added"};
        EXPECT_EQ(found->how, expected);
    }
}

TEST(KnownMistakes, TakeAWindowsOwnColumnFromThePassBefore)
{
    // Three windows in each segment, so that the last one starts from a column of the same pass.
    const Model model = modelOf(1088, 1, 16);
    ASSERT_EQ(model.cut.rows(), 3U);
    const Values dump =
        dumpWith(model, {Mistake::borderOfWindow, -1}, [](Stage stage) { return stage == Stage::backward; });
    const auto found = findingIn(model, dump, Stage::backward);
    ASSERT_TRUE(found);
    EXPECT_TRUE(names(*found, "border metrics are those of the window before the right one (rule 20)"))
        << textOf(*found);
}

TEST(FittedMistakes, TellTheRangeOfAnAddress)
{
    // Segments of 68 steps, in windows of 34: addresses that count from the start of each are not those of the block.
    const Model model = modelOf(272, 1, 16);
    const auto foundOf = [&](AddressError::Range range) {
        const AddressError error = {AddressError::stuckHigh, 3, range};
        const Values dump =
            dumpWith(model, {Mistake::forwardMisread, error}, [](Stage stage) { return stage == Stage::ratio; });
        const auto found = findingIn(model, dump, Stage::ratio);
        return found ? textOf(*found) : "";
    };
    const auto expectFound = [&](AddressError::Range range, const std::string& text) {
        const std::string found = foundOf(range);
        EXPECT_EQ(found.rfind("bit 3 of the address of forward metrics" + text + " reads as 1 (rule 8); ", 0), 0U)
            << found;
    };
    expectFound(AddressError::block, "");
    expectFound(AddressError::segment, " within a segment");
    expectFound(AddressError::window, " within a window");
}

TEST(FittedMistakes, TellEveryMaskOfBorders)
{
    for (int mask = -2048; mask < 2048; ++mask) {
        if (mask != 0) {
            const std::string text = otherMask(mask).text;
            EXPECT_TRUE(text.find("low bits of border metrics are") != std::string::npos ||
                        text.find("border metrics are ANDed with 0x") == 0)
                << mask << ": " << text;
        }
    }
    EXPECT_EQ(otherMask(-2048).text, "fifteen low bits of border metrics are cleared, not seven (rule 11)");
}

}  // namespace
}  // namespace morvik::comparison

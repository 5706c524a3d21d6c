// Stimulus for units: what its cases meet, and that they are the same for the same seed.
#include <gtest/gtest.h>

#include <set>

#include "hardware/units/Situations.h"
#include "hardware/units/Stimulus.h"

namespace morvik::units {
namespace {

using Values = std::vector<std::int32_t>;

constexpr std::array<Number, 9> everyUnit = {Number::intrinsic,
                                             Number::branch,
                                             Number::forward,
                                             Number::backward,
                                             Number::ratio,
                                             Number::extrinsic,
                                             Number::address,
                                             Number::tail,
                                             Number::border};

std::string unitName(Number unit)
{
    return allUnits()[static_cast<std::size_t>(unit)].name;
}

StimulusSettings settingsOf(int algorithm, unsigned randomCases, std::uint64_t seed = 1)
{
    return {algorithm, seed, randomCases, {40, 6144}};
}

std::vector<Values> casesOf(Number unit, const StimulusSettings& settings)
{
    std::vector<Values> cases;
    stimulate(unit, settings, [&](const Values& inputs) { cases.push_back(inputs); });
    return cases;
}

TEST(UnitStimulus, MeetsEverySituationInEachPlaceWithoutRandomCases)
{
    unsigned met = 0;
    for (const Number unit : everyUnit) {
        for (int algorithm = 0; algorithm < 3; ++algorithm) {
            Situations situations(unit, algorithm);
            const Extent extent = stimulate(unit, settingsOf(algorithm, 0), [&](const Values& inputs) {
                situations.add(inputs, compute(unit, algorithm, inputs));
            });
            EXPECT_GT(extent.directed, 0U);
            EXPECT_EQ(extent.random, 0U);
            for (const Situation& situation : situations.all()) {
                EXPECT_GT(situation.fewest(), 0U) << unitName(unit) << ' ' << algorithm << ' ' << situation.name;
                ++met;
            }
        }
    }
    EXPECT_EQ(met, 3 * (5 + 4 + 2 * 5 + 6 + 2 + 3 + 2 + 2) + 2 + 3 * 15);
}

TEST(UnitStimulus, GivesEveryCaseOfASmallUnitOnce)
{
    for (const Number unit : {Number::intrinsic, Number::branch, Number::address}) {
        const auto cases = casesOf(unit, settingsOf(0, 100));
        EXPECT_EQ(std::set<Values>(cases.begin(), cases.end()).size(), cases.size());
        const auto count = unit == Number::intrinsic ? 256U * 256 : unit == Number::branch ? 383U * 256 : 40U + 6144;
        EXPECT_EQ(cases.size(), count) << unitName(unit);
    }
    std::set<std::int32_t> seen;
    for (const Values& column : casesOf(Number::border, settingsOf(0, 100))) {
        seen.insert(column[7]);
    }
    EXPECT_EQ(seen.size(), 4096U);
}

TEST(UnitStimulus, IsTheSameForTheSameSeed)
{
    for (const Number unit : everyUnit) {
        const auto cases = casesOf(unit, settingsOf(2, 10));
        EXPECT_EQ(cases, casesOf(unit, settingsOf(2, 10)));
        const bool isExhaustive = stimulate(unit, settingsOf(2, 10), [](const Values&) {}).isExhaustive;
        EXPECT_EQ(cases == casesOf(unit, settingsOf(2, 10, 7)), isExhaustive) << unitName(unit);
    }
}

TEST(UnitStimulus, HasValuesThatFitTheirColumns)
{
    for (const Number unit : everyUnit) {
        for (int algorithm = 0; algorithm < 3; ++algorithm) {
            const morvik::tables::Table table = tableOf(unit, algorithm);
            for (const Values& inputs : casesOf(unit, settingsOf(algorithm, 50))) {
                const auto row = rowOf(unit, algorithm, inputs, compute(unit, algorithm, inputs));
                ASSERT_EQ(row.size(), table.columns.size());
                for (std::size_t i = 0; i < row.size(); ++i) {
                    const auto& [name, bits, isSigned] = table.columns[i];
                    const std::int64_t lowest = isSigned ? -(std::int64_t{1} << (bits - 1)) : 0;
                    ASSERT_GE(row[i], lowest) << unitName(unit) << ' ' << name;
                    ASSERT_LT(row[i], lowest + (std::int64_t{1} << bits)) << unitName(unit) << ' ' << name;
                }
            }
        }
    }
}

TEST(UnitPorts, RefuseWhatTheirRegistersCannotHold)
{
    const auto refusal = [](Number unit, int algorithm, const Values& inputs) -> std::string {
        try {
            compute(unit, algorithm, inputs);
        } catch (const BadInput& error) {
            return error.what();
        }
        return "";
    };
    EXPECT_EQ(refusal(Number::intrinsic, 0, {0, 128}), "systematic 128 is not allowed, expected -128 to 127");
    EXPECT_EQ(refusal(Number::intrinsic, 3, {0, 0}), "algorithm 3 is not allowed, expected 0 to 2");
    EXPECT_EQ(refusal(Number::branch, 0, {0}), "branch takes 2 values, not 1");
    EXPECT_EQ(refusal(Number::address, 0, {41, 0}), "block_size 41 is no block size of 3GPP TS 36.212");
    EXPECT_EQ(refusal(Number::address, 0, {40, 40}), "step 40 is not allowed, expected 0 to 39");
    EXPECT_EQ(refusal(Number::address, 0, {40, -1}), "step -1 is not allowed, expected 0 to 39");
    Values column(20);
    column[3] = -2049;
    EXPECT_EQ(refusal(Number::forward, 0, column), "alpha3 -2049 is not allowed, expected -2048 to 2047");
    column[3] = 0;
    column[15] = 1;
    EXPECT_EQ(refusal(Number::backward, 1, column),
              "pending7 1 is not allowed, expected 0: only the algorithm with a table has pending corrections");
    EXPECT_EQ(refusal(Number::backward, 2, column), "");
}

}  // namespace
}  // namespace morvik::units

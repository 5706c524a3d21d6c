// Evidence: what is said of the signs under all mistakes at once is what undoing each of them gives.
#include "hardware/diagnosis/Evidence.h"

#include <gtest/gtest.h>

#include "support/Accidents.h"

namespace morvik::diagnosis {
namespace {

Case caseOf(const morvik::support::SentFrame& frame)
{
    return {{frame.soft.sys, frame.soft.par1, frame.soft.par2}, {frame.bits.begin(), frame.bits.end()}};
}

std::vector<Case> someCases(unsigned K, double deviation)
{
    std::vector<Case> cases;
    for (const morvik::support::SentFrame& frame : morvik::support::sentFrames(K, 2, deviation, 1)) {
        cases.push_back(caseOf(frame));
    }
    return cases;
}

void expectWhatUndoingGives(const std::vector<Case>& cases, const std::vector<Suspicion>& found)
{
    for (const Suspicion& suspicion : found) {
        std::vector<Case> right;
        right.reserve(cases.size());
        for (const Case& each : cases) {
            right.push_back(undone(each, suspicion.mistakes));
        }
        const Signs signs = appearanceOf(right).all();
        ASSERT_EQ(suspicion.signs.wrong, signs.wrong);
        ASSERT_EQ(suspicion.signs.all, signs.all);
    }
}

TEST(Evidence, IsWhatUndoingEachMistakeGives)
{
    const std::vector<Case> cases = someCases(40, 8);
    const std::vector<Suspicion> found = suspicions(cases);
    EXPECT_EQ(found.size(), 6U * 6 * 8 * 6);
    expectWhatUndoingGives(cases, found);
}

TEST(Evidence, IsSoForOtherNumbersOfRows)
{
    std::vector<Case> cases = someCases(40, 8);
    for (auto* stream : {&cases[0].received.rsc1Sys, &cases[0].received.rsc1Par, &cases[0].received.rsc2Par}) {
        stream->insert(stream->begin() + 11, 7, 5);
    }
    const std::vector<Suspicion> more = suspicions(cases);
    EXPECT_EQ(more.size(), 3U * 6 * 6 * 8 * 6) << "the second block is right as it is";
    expectWhatUndoingGives(cases, more);

    cases = someCases(40, 8);
    for (auto* stream : {&cases[1].received.rsc1Sys, &cases[1].received.rsc1Par, &cases[1].received.rsc2Par}) {
        stream->resize(41);
    }
    const std::vector<Suspicion> fewer = suspicions(cases);
    EXPECT_EQ(fewer.size(), 6U * 6 * 8) << "a tail that is not there has no order";
    expectWhatUndoingGives(cases, fewer);
}

TEST(Evidence, IsSoForSmallerSizes)
{
    const std::vector<Case> cases = someCases(56, 8);
    const std::vector<Suspicion> found = suspicionsOfSmallerSizes(cases);
    EXPECT_EQ(found.size(), 2U * 6 * 8 * 6) << "40 and 48 bits";
    expectWhatUndoingGives(cases, found);
}

TEST(Evidence, EncodesAsTheStandardDoes)
{
    const std::vector<Case> cases = someCases(512, 0);
    for (const Case& each : cases) {
        const auto bits = encoded(each.sent);
        for (std::size_t k = 0; k < 516; ++k) {
            EXPECT_EQ(bits[0][k] != 0, each.received.rsc1Sys[k] > 0);
            EXPECT_EQ(bits[1][k] != 0, each.received.rsc1Par[k] > 0);
            EXPECT_EQ(bits[2][k] != 0, each.received.rsc2Par[k] > 0);
        }
    }
}

TEST(Evidence, MeasuresAmplitudeAndPower)
{
    const Appearance clear = appearanceOf(someCases(512, 0));
    EXPECT_EQ(clear.all().wrong, 0);
    EXPECT_EQ(clear.all().all, 2 * 3 * 516.0);
    EXPECT_EQ(clear.amplitude, 8);
    EXPECT_EQ(clear.power, 64);
    const Appearance noisy = appearanceOf(someCases(6144, 10));
    EXPECT_NEAR(noisy.amplitude, 8, 0.3);
    EXPECT_NEAR(noisy.power - noisy.amplitude * noisy.amplitude, 100, 3);
    EXPECT_NEAR(noisy.all().fraction(), 0.2119, 0.01) << "Q(0.8)";
    EXPECT_NEAR(noisy.streams[2].fraction(), 0.2119, 0.02);
}

TEST(Evidence, CountsZerosByHalves)
{
    Case silent = someCases(40, 0).front();
    for (auto* stream : {&silent.received.rsc1Sys, &silent.received.rsc1Par, &silent.received.rsc2Par}) {
        stream->assign(44, 0);
    }
    const Signs signs = appearanceOf({silent}).all();
    EXPECT_EQ(signs.fraction(), 0.5);
    EXPECT_EQ(signs.certainty(), 0);
}

}  // namespace
}  // namespace morvik::diagnosis

// Diagnosis: each mistake and pair of mistakes is found, and noise is not taken for one.
#include "hardware/diagnosis/Diagnosis.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <set>

#include "hardware/diagnosis/DiagnosisText.h"
#include "support/Accidents.h"

namespace morvik::diagnosis {
namespace {

using morvik::support::Accident;
using morvik::support::SentFrame;

std::vector<Case> casesOf(const std::vector<SentFrame>& frames)
{
    std::vector<Case> cases;
    cases.reserve(frames.size());
    for (const SentFrame& frame : frames) {
        cases.push_back({{frame.soft.sys, frame.soft.par1, frame.soft.par2}, {frame.bits.begin(), frame.bits.end()}});
    }
    return cases;
}

DecoderOptions with(int units, int algorithm = 1)
{
    DecoderOptions options;
    options.generics.C_NUM_PU = units;
    options.generics.C_ALGORITHM_TYPE = algorithm;
    return options;
}

std::set<std::string> found(const Diagnosis& diagnosis)
{
    std::set<std::string> names;
    for (const Explanation& each : explain(diagnosis.best.mistakes)) {
        names.insert(each.what);
    }
    return names;
}

using Names = std::set<std::string>;

constexpr unsigned sizes[] = {40, 104, 512, 1024, 6144};
constexpr double clear = 6;  // deviation in steps: Eb/N0 above 4 dB, where every block decodes

// ---- Healthy and hopeless blocks

TEST(Diagnosis, FindsNothingInBlocksThatDecode)
{
    for (const unsigned K : sizes) {
        for (const int units : {2, 4, 8}) {
            for (unsigned seed = 0; seed < 5; ++seed) {
                const Diagnosis diagnosis =
                    diagnose(casesOf(morvik::support::sentFrames(K, 1 + seed, clear, seed)), with(units));
                EXPECT_EQ(diagnosis.verdict, Verdict::healthy) << K << ' ' << units << ' ' << seed;
                EXPECT_EQ(found(diagnosis), Names{});
                EXPECT_EQ(diagnosis.best.decoded, 1 + seed);
            }
        }
    }
}

TEST(Diagnosis, BlamesNoiseAloneForBlocksThatAreTooNoisy)
{
    for (const unsigned K : sizes) {
        for (const int units : {2, 4, 8}) {
            for (unsigned seed = 0; seed < 3; ++seed) {
                const auto frames = morvik::support::sentFrames(K, K < 100 ? 4 : 1, 13, seed);  // below -2 dB
                const Diagnosis diagnosis = diagnose(casesOf(frames), with(units));
                EXPECT_EQ(diagnosis.verdict, Verdict::noisy) << K << ' ' << units << ' ' << seed;
                EXPECT_EQ(found(diagnosis), Names{});
                ASSERT_TRUE(diagnosis.noise);
                EXPECT_GT(diagnosis.noise->failed, diagnosis.noise->simulated / 2);
                EXPECT_NEAR(diagnosis.noise->ebn0, K < 100 ? -2.1 : -2.5, 1.2);
            }
        }
    }
}

/// Where about half of the blocks fail, other ways to read them decode now and then by chance.
TEST(Diagnosis, TakesNoChanceForAMistake)
{
    for (unsigned seed = 0; seed < 300; ++seed) {
        const Diagnosis diagnosis = diagnose(casesOf(morvik::support::sentFrames(104, 1, 8.6, seed)), with(2));
        EXPECT_EQ(found(diagnosis), Names{}) << seed;
        EXPECT_TRUE(diagnosis.verdict == Verdict::healthy || diagnosis.verdict == Verdict::noisy) << seed;
    }
}

TEST(Diagnosis, TellsWhenBitsBelongToOtherBlocks)
{
    for (const unsigned K : sizes) {
        std::vector<SentFrame> frames = morvik::support::sentFrames(K, 2, clear, 1);
        std::swap(frames[0].bits, frames[1].bits);
        const Diagnosis diagnosis = diagnose(casesOf(frames), with(2));
        EXPECT_EQ(diagnosis.verdict, Verdict::unrelated) << K;
    }
}

TEST(Diagnosis, TellsWhichStreamDoesNotBelong)
{
    std::vector<SentFrame> frames = morvik::support::sentFrames(512, 2, clear, 1);
    std::swap(frames[0].soft.par2, frames[1].soft.par2);
    const Diagnosis diagnosis = diagnose(casesOf(frames), with(2));
    EXPECT_EQ(diagnosis.verdict, Verdict::strange);
    EXPECT_EQ(diagnosis.stranger, 2U);
    EXPECT_NE(textOf(diagnosis).find("A stream does not belong to these blocks: the signs of rsc2_par are wrong in "),
              std::string::npos);
}

// ---- One mistake, and two

TEST(Diagnosis, FindsEachMistakeInEachSize)
{
    for (const Accident& accident : morvik::support::accidents()) {
        for (const unsigned K : sizes) {
            for (const int units : {2, 4, 8}) {
                SCOPED_TRACE(accident.what + ", K = " + std::to_string(K) + ", units " + std::to_string(units));
                std::vector<SentFrame> frames = morvik::support::sentFrames(K, 4, clear, K);
                std::for_each(frames.begin(), frames.end(), accident.happen);
                const Diagnosis diagnosis = diagnose(casesOf(frames), with(units));
                EXPECT_EQ(found(diagnosis), Names{accident.what});
                EXPECT_EQ(diagnosis.best.decoded, 4U);
                const bool decodesAnyway = accident.kind == "tail" && diagnosis.attempts.front().decoded == 4;
                EXPECT_EQ(diagnosis.verdict, decodesAnyway ? Verdict::careless : Verdict::mistaken);
            }
        }
    }
}

TEST(Diagnosis, FindsPairsOfMistakes)
{
    const std::vector<Accident>& all = morvik::support::accidents();
    int units = 2;
    for (std::size_t a = 0; a < all.size(); ++a) {
        for (std::size_t b = a + 1; b < all.size(); ++b) {
            const bool isPossible =
                all[a].kind != all[b].kind &&
                !(all[a].kind == "tail" && all[b].what.find("tail is missing") != std::string::npos);
            if (!isPossible) {
                continue;
            }
            units = units == 8 ? 2 : 2 * units;
            for (const unsigned K : {40U, 512U}) {
                SCOPED_TRACE(all[a].what + ", " + all[b].what + ", K = " + std::to_string(K));
                std::vector<SentFrame> frames = morvik::support::sentFrames(K, 4, clear, 10);
                std::for_each(frames.begin(), frames.end(), all[a].happen);
                std::for_each(frames.begin(), frames.end(), all[b].happen);
                const Diagnosis diagnosis = diagnose(casesOf(frames), with(units));
                EXPECT_EQ(found(diagnosis), (Names{all[a].what, all[b].what}));
                EXPECT_EQ(diagnosis.best.decoded, 4U);
            }
        }
    }
}

TEST(Diagnosis, FindsMistakesInNoiseThatKeepsBlocksFromDecoding)
{
    std::vector<SentFrame> frames = morvik::support::sentFrames(512, 2, 13, 3);
    for (SentFrame& frame : frames) {
        std::swap(frame.soft.par1, frame.soft.par2);
        morvik::support::multiply(frame, -1);
    }
    const Diagnosis diagnosis = diagnose(casesOf(frames), with(2));
    EXPECT_EQ(found(diagnosis), (Names{"rsc1_par and rsc2_par are swapped", "the sign of all soft values is flipped"}));
    EXPECT_EQ(diagnosis.verdict, Verdict::noisy);
}

TEST(Diagnosis, FindsTheTailsOrderInABlockThatFailsByIt)
{
    unsigned failing = 0;
    unsigned named = 0;
    for (unsigned seed = 0; seed < 150; ++seed) {
        const std::vector<SentFrame> frames = morvik::support::sentFrames(40, 1, 7, seed);
        if (diagnose(casesOf(frames), with(2)).verdict != Verdict::healthy) {
            continue;
        }
        for (const Accident& accident : morvik::support::accidents()) {
            std::vector<SentFrame> mistaken = frames;
            if (accident.kind == "tail") {
                accident.happen(mistaken.front());
                const Diagnosis diagnosis = diagnose(casesOf(mistaken), with(2));
                const bool isFailing = diagnosis.attempts.front().decoded == 0;
                failing += isFailing ? 1U : 0U;
                named += isFailing && found(diagnosis) == Names{accident.what} ? 1U : 0U;
            }
        }
    }
    EXPECT_GT(failing, 20U);
    EXPECT_GT(named, failing * 3 / 4) << failing;
}

// ---- Scale

void expectScale(const std::vector<SentFrame>& frames, const DecoderOptions& options, double factor, const Names& names)
{
    std::vector<SentFrame> scaled = frames;
    for (SentFrame& frame : scaled) {
        morvik::support::multiply(frame, factor);
    }
    const Diagnosis diagnosis = diagnose(casesOf(scaled), options);
    EXPECT_EQ(found(diagnosis), names);
    EXPECT_EQ(diagnosis.verdict, Verdict::mistaken);
    EXPECT_NEAR(diagnosis.appearance.amplitude, 8, 2);
}

TEST(Diagnosis, FindsAMissingOrDoubledScale)
{
    const std::string missing = "the scale is missing or too small: values are about 8 times too small";
    const std::string doubled = "the scale is doubled or too large: values are about 8 times too large";
    for (const auto& [K, deviation] : {std::pair{512U, 8.3}, {6144U, 8.8}}) {
        for (const int units : {2, 4, 8}) {
            for (const int algorithm : {0, 1, 2}) {
                SCOPED_TRACE(std::to_string(K) + ' ' + std::to_string(units) + ' ' + std::to_string(algorithm));
                const double clearer = algorithm == 0 ? deviation - 0.5 : deviation;
                const std::vector<SentFrame> frames = morvik::support::sentFrames(K, 12, clearer, 5);
                expectScale(frames, with(units, algorithm), 8, {doubled});
                if (algorithm == 2 || (algorithm == 1 && K == 6144)) {  // others put up with it
                    expectScale(frames, with(units, algorithm), 1.0 / 8, {missing});
                }
            }
        }
    }
    expectScale(morvik::support::sentFrames(40, 8, 7, 5), with(2, 2), 1.0 / 8, {missing});
}

TEST(Diagnosis, FindsAScaleBesideAnotherMistake)
{
    const std::string doubled = "the scale is doubled or too large: values are about 64 times too large";
    for (const Accident& accident : morvik::support::accidents()) {
        std::vector<SentFrame> frames = morvik::support::sentFrames(512, 4, 7.5, 2);
        std::for_each(frames.begin(), frames.end(), accident.happen);
        expectScale(frames, with(4), 64, {doubled, accident.what});
    }
}

TEST(Diagnosis, LeavesAScaleAloneThatDecodes)
{
    for (const double factor : {0.125, 0.25, 0.5, 2.0, 4.0, 8.0, 1000.0}) {
        std::vector<SentFrame> frames = morvik::support::sentFrames(104, 4, 2, 5);
        for (SentFrame& frame : frames) {
            morvik::support::multiply(frame, factor);
        }
        EXPECT_EQ(diagnose(casesOf(frames), with(2)).verdict, Verdict::healthy) << factor;
    }
}

TEST(Diagnosis, CountsWhatIsClipped)
{
    std::vector<SentFrame> frames = morvik::support::sentFrames(40, 1, 0, 1);
    frames[0].soft.sys[3] = 128;
    frames[0].soft.par1[4] = -129;
    frames[0].soft.par2[5] = 127;
    frames[0].soft.par2[6] = -128;
    EXPECT_EQ(diagnose(casesOf(frames), with(2)).clipped, 2U);
}

// ---- Sizes

TEST(Diagnosis, FindsTheSizeOfAPaddedBlock)
{
    for (const auto& [K, padded] : {std::pair{40U, 104U}, {96U, 104U}, {512U, 1024U}, {5952U, 6144U}}) {
        for (const int units : {2, 8}) {
            std::vector<SentFrame> frames = morvik::support::sentFrames(K, 2, clear, padded);
            for (SentFrame& frame : frames) {
                frame.bits.resize(padded);
                for (auto* stream : {&frame.soft.sys, &frame.soft.par1, &frame.soft.par2}) {
                    stream->resize(padded + 4);
                }
            }
            const Diagnosis diagnosis = diagnose(casesOf(frames), with(units));
            EXPECT_EQ(diagnosis.verdict, Verdict::mistaken) << K;
            EXPECT_EQ(found(diagnosis), Names{"the block is one of " + std::to_string(K) + " bits, padded to more"});
        }
    }
}

}  // namespace
}  // namespace morvik::diagnosis

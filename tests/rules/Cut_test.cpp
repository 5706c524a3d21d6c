// Cut: segments and windows against a second formulation, and where each step is computed.
#include "rules/Cut.h"

#include <gtest/gtest.h>

#include <vector>

#include "rules/BlockSizes.h"
#include "support/PlainDecoder.h"

namespace {

using morvik::rules::Cut;
using morvik::rules::StepPlace;
using morvik::rules::Window;

std::vector<unsigned> windowLengths(const Cut& cut)
{
    std::vector<unsigned> lengths;
    for (unsigned row = 0; row < cut.rows(); ++row) {
        lengths.push_back(cut.windowLength(row));
    }
    return lengths;
}

void expectCutAsPlain(unsigned K, unsigned units, unsigned threads)
{
    const Cut cut(K, units, threads);
    const auto plain = morvik::plain::segmentation(K, units * threads);
    ASSERT_EQ(cut.dividesEvenly(), plain.has_value()) << K << ' ' << units << ' ' << threads;
    if (!plain) {
        return;
    }
    ASSERT_EQ(cut.segments(), plain->segments) << K << ' ' << units << ' ' << threads;
    ASSERT_EQ(cut.segmentLength(), plain->length);
    ASSERT_EQ(windowLengths(cut), plain->windowLengths) << K << ' ' << units << ' ' << threads;
    for (unsigned row = 0; row < cut.rows(); ++row) {
        ASSERT_EQ(cut.windowStart(row), plain->windowOffsets[row]);
    }
    ASSERT_EQ(cut.windowStart(cut.rows()), plain->length);
}

/// Every K, whether the interleaver knows it or not, on units and threads that need not be powers of two.
TEST(Cut, IsThatOfThePlainDecoder)
{
    for (unsigned K = 0; K <= 6144; ++K) {
        for (const unsigned units : {1U, 2U, 3U, 4U, 8U}) {
            ASSERT_NO_FATAL_FAILURE(expectCutAsPlain(K, units, 4));
        }
        ASSERT_NO_FATAL_FAILURE(expectCutAsPlain(K, 2, 1));
        ASSERT_NO_FATAL_FAILURE(expectCutAsPlain(K, 1, 3));
    }
}

TEST(Cut, TakesAsManyUnitsAndThreadsAsThereMayBe)
{
    const Cut cut(6144, 0xFFFFFFFF, 0xFFFFFFFF);
    EXPECT_EQ(cut.segments(), 64U);
    EXPECT_EQ(cut.unitsAtWork(), 64U);
    EXPECT_EQ(cut.placeOf(6143).unit, 63U);
}

TEST(Cut, OfNoBlockHasNoWindow)
{
    for (const Cut& none : {Cut(), Cut(0, 8)}) {
        EXPECT_EQ(none.K(), 0U);
        EXPECT_EQ(none.segments(), 1U);
        EXPECT_EQ(none.windows(), 0U);
        EXPECT_TRUE(none.dividesEvenly());
    }
    EXPECT_EQ(Cut().segmentsOfUnit(), 1U);
    EXPECT_EQ(Cut().unitsAtWork(), 1U);
}

TEST(Cut, WindowsCoverEachStepOnceRowByRow)
{
    for (const auto& size : morvik::rules::blockSizes) {
        for (const unsigned units : {2U, 4U, 8U}) {
            const Cut cut(size.K, units);
            std::vector<unsigned> covered(size.K);
            ASSERT_EQ(cut.windows(), cut.segments() * cut.rows());
            for (unsigned i = 0; i < cut.windows(); ++i) {
                const Window window = cut.window(i);
                ASSERT_EQ(window.row, i / cut.segments());
                ASSERT_EQ(window.segment, i % cut.segments());
                ASSERT_EQ(window.last - window.first + 1, cut.windowLength(window.row));
                for (unsigned step = window.first; step <= window.last; ++step) {
                    ++covered[step];
                    ASSERT_EQ(step / cut.segmentLength(), window.segment);
                    ASSERT_EQ(cut.placeOf(step).segment, window.segment);
                    ASSERT_EQ(cut.placeOf(step).row, window.row);
                    ASSERT_EQ(cut.windowAt(step).first, window.first);
                    ASSERT_EQ(cut.windowAt(step).last, window.last);
                }
            }
            ASSERT_EQ(covered, std::vector<unsigned>(size.K, 1)) << size.K << ' ' << units;
        }
    }
}

TEST(Cut, HasTheExampleOfTheDocuments)
{
    const Cut two(1280, 2);
    EXPECT_EQ(two.segments(), 8U);
    EXPECT_EQ(windowLengths(two), (std::vector<unsigned>{64, 48, 48}));
    EXPECT_EQ(two.window(10).first, 2 * 160 + 64U);
    EXPECT_EQ(two.window(10).last, 2 * 160 + 111U);
    EXPECT_EQ(windowLengths(Cut(1280, 8)), (std::vector<unsigned>{40, 40}));
    EXPECT_EQ(windowLengths(Cut(6144, 2)), std::vector<unsigned>(12, 64));
}

/// What a window reaches is the start of the window that ends where it begins, in the order of the trellis.
TEST(Cut, WindowBeforeEndsWhereTheWindowStarts)
{
    for (const unsigned K : {40U, 128U, 1280U, 6144U}) {
        const Cut cut(K, 4);
        for (unsigned i = 1; i < cut.windows(); ++i) {
            const unsigned before = morvik::rules::windowBefore(i, cut.segments(), cut.windows());
            ASSERT_EQ(cut.window(before).last + 1, cut.window(i).first) << K << ' ' << i;
        }
    }
}

TEST(Cut, TellsWhatRecursionsStartFrom)
{
    const Cut three(1280, 2);  // 8 segments of 160 steps in three windows
    EXPECT_TRUE(three.startsSegment(0));
    EXPECT_TRUE(three.startsSegment(160));
    EXPECT_FALSE(three.startsSegment(159));
    EXPECT_FALSE(three.startsSegment(64));
    EXPECT_FALSE(three.startsSegment(1280));
    EXPECT_TRUE(three.startsAtTail(three.window(23)));
    EXPECT_FALSE(three.startsAtTail(three.window(22)));
    EXPECT_FALSE(three.startsAtTail(three.window(7)));
    for (unsigned i = 0; i < three.windows(); ++i) {
        EXPECT_EQ(three.startsFromThisPass(three.window(i)), i >= 16 && i < 23) << i;
    }
    const Cut two(1280, 4);
    for (unsigned i = 0; i < two.windows(); ++i) {
        EXPECT_FALSE(two.startsFromThisPass(two.window(i))) << i;
    }
}

void expectPlace(const Cut& cut, unsigned step, const StepPlace& expected)
{
    const StepPlace place = cut.placeOf(step);
    EXPECT_EQ(place.segment, expected.segment) << step;
    EXPECT_EQ(place.row, expected.row) << step;
    EXPECT_EQ(place.unit, expected.unit) << step;
    EXPECT_EQ(place.thread, expected.thread) << step;
}

TEST(Cut, PlacesStepsOfSegmentsWithThreeWindows)
{
    const Cut cut(1280, 2);
    EXPECT_EQ(cut.segmentLength(), 160U);
    EXPECT_EQ(cut.unitsAtWork(), 2U);
    expectPlace(cut, 0, {0, 0, 0, 0});
    expectPlace(cut, 63, {0, 0, 0, 0});
    expectPlace(cut, 64, {0, 1, 0, 0});
    expectPlace(cut, 111, {0, 1, 0, 0});
    expectPlace(cut, 112, {0, 2, 0, 0});
    expectPlace(cut, 159, {0, 2, 0, 0});
    expectPlace(cut, 160, {1, 0, 0, 1});
    expectPlace(cut, 639, {3, 2, 0, 3});
    expectPlace(cut, 640, {4, 0, 1, 0});
    expectPlace(cut, 1282, {7, 2, 1, 3});
}

TEST(Cut, DealsFewSegmentsToAllUnits)
{
    EXPECT_EQ(Cut(1280, 8).unitsAtWork(), 8U);
    expectPlace(Cut(1280, 8), 3 * 80, {3, 0, 1, 1});
    EXPECT_EQ(Cut(128, 8).unitsAtWork(), 2U);
    expectPlace(Cut(128, 8), 64, {1, 0, 1, 0});
    EXPECT_EQ(Cut(40, 8).unitsAtWork(), 1U);
    expectPlace(Cut(40, 8), 42, {0, 0, 0, 0});
}

}  // namespace

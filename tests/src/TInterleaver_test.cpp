// TInterleaver: tests of the factory, the inverse table and the printed tables.
#include "TInterleaver.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <memory>

#include "support/CapturedStreams.h"

namespace {

using Table = std::vector<unsigned>;
using InterleaverPointer = std::unique_ptr<TInterleaver>;

/// Reverses blocks, and leaves all else to the base.
class Reversal : public TInterleaver {
public:
    bool calcInterleaver(Table& out, unsigned K) const override
    {
        out.resize(K);
        for (unsigned i = 0; i < K; ++i) {
            out[i] = K - 1 - i;
        }
        return true;
    }

    std::string getProperties() const override
    {
        return "";
    }
};

/// The error line with which a property string is refused.
std::string refusalOfInterleaver(const std::string& properties)
{
    const CapturedStreams streams;
    EXPECT_EQ(InterleaverPointer(TInterleaver::create(properties)), nullptr) << properties;
    EXPECT_EQ(streams.out(), "");
    return streams.err();
}

/// What an interleaver prints for the sizes from first to last.
std::string dump(TInterleaver& interleaver, unsigned first, unsigned last, bool showSize)
{
    const CapturedStreams streams;
    interleaver.dumpAll(first, last, showSize);
    EXPECT_EQ(streams.err(), "");
    return streams.out();
}

}  // namespace

TEST(TInterleaver, IsMadeByItsExactName)
{
    for (const char* properties : {"3GPPLTE", "3GPPLTE:"}) {
        const InterleaverPointer interleaver(TInterleaver::create(properties));
        ASSERT_NE(interleaver, nullptr) << properties;
        EXPECT_EQ(interleaver->getProperties(), "3GPPLTE");
        EXPECT_TRUE(interleaver->itsPi.empty());
        EXPECT_TRUE(interleaver->itsPiInv.empty());
    }
    std::vector<std::string> names = TInterleaver::getNames();
    EXPECT_EQ(names, std::vector<std::string>{"3GPPLTE"});
    names.clear();  // a list of our own
    EXPECT_EQ(TInterleaver::getNames().size(), 1U);
}

TEST(TInterleaver, RefusesOtherNames)
{
    for (const std::string type : {"QPP", "3gpplte", " 3GPPLTE", "3GPPLTE ", "3GPPLT", ""}) {
        EXPECT_EQ(refusalOfInterleaver(type), "ERROR:TInterleaver:Unrecognised type:" + type + "\n");
    }
    EXPECT_EQ(refusalOfInterleaver(":3GPPLTE"), "ERROR:TInterleaver:Unrecognised type:\n");
    EXPECT_EQ(refusalOfInterleaver("3GPPLTE:x"), "ERROR:TInterleaver3GPPLTE:Unexpected properties:x\n");
}

TEST(TInterleaver, KnowsEverySizeBut0)
{
    const Reversal interleaver;
    EXPECT_FALSE(interleaver.valid(0));
    EXPECT_TRUE(interleaver.valid(1));
    EXPECT_TRUE(interleaver.valid(std::numeric_limits<unsigned>::max()));
}

TEST(TInterleaver, InvertsThePermutation)
{
    const InterleaverPointer interleaver(TInterleaver::create("3GPPLTE"));
    for (const unsigned K : {40U, 6144U, 48U}) {
        EXPECT_TRUE(interleaver->calcDeinterleaver(interleaver->itsPiInv, K));
        ASSERT_EQ(interleaver->itsPi.size(), K);
        ASSERT_EQ(interleaver->itsPiInv.size(), K);
        for (unsigned j = 0; j < K; ++j) {
            ASSERT_EQ(interleaver->itsPi[interleaver->itsPiInv[j]], j) << K;
        }
    }
}

TEST(TInterleaver, InvertsATableOfTheWantedSizeAsItStands)
{
    const InterleaverPointer interleaver(TInterleaver::create("3GPPLTE"));
    interleaver->itsPi = {2, 0, 1};
    EXPECT_TRUE(interleaver->calcDeinterleaver(interleaver->itsPiInv, 3));
    EXPECT_EQ(interleaver->itsPi, (Table{2, 0, 1}));
    EXPECT_EQ(interleaver->itsPiInv, (Table{1, 2, 0}));
}

TEST(TInterleaver, EmptiesBothTablesForAnUnknownSize)
{
    const InterleaverPointer interleaver(TInterleaver::create("3GPPLTE"));
    interleaver->calcDeinterleaver(interleaver->itsPiInv, 40);
    EXPECT_TRUE(interleaver->calcDeinterleaver(interleaver->itsPiInv, 41));
    EXPECT_TRUE(interleaver->itsPi.empty());
    EXPECT_TRUE(interleaver->itsPiInv.empty());
}

TEST(TInterleaver, PrintsALineForEachSizeItKnows)
{
    Reversal interleaver;
    EXPECT_EQ(dump(interleaver, 0, 3, true), "1: 0\n2: 1 0\n3: 2 1 0\n");
    EXPECT_EQ(interleaver.itsPi, (Table{2, 1, 0}));
    interleaver.itsPi = {1, 2, 0};  // of the wanted size: printed as it stands
    EXPECT_EQ(dump(interleaver, 3, 3, false), "1 2 0\n");
}

TEST(TInterleaver, PrintsNothingForUnknownSizesAndEmptyRanges)
{
    const InterleaverPointer interleaver(TInterleaver::create("3GPPLTE"));
    EXPECT_EQ(dump(*interleaver, 41, 47, true), "");
    EXPECT_EQ(dump(*interleaver, 48, 40, true), "");
    const unsigned last = std::numeric_limits<unsigned>::max();
    EXPECT_EQ(dump(*interleaver, last - 1, last, true), "");

    const std::string two = dump(*interleaver, 40, 48, true);
    EXPECT_EQ(two.rfind("40: 0 13 6 19 12 ", 0), 0U);
    EXPECT_NE(two.find("\n48: 0 19 14 33 28 "), std::string::npos);
    EXPECT_EQ(std::count(two.begin(), two.end(), '\n'), 2);
}

// The blocks of vectors: which there are, and what the directed ones look like.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "hardware/vectors/Blocks.h"
#include "link/FrameSource.h"

namespace {

using morvik::vectors::edgeSizes;
using morvik::vectors::edgeTags;
using morvik::vectors::Settings;
using morvik::vectors::Stimulus;

Settings smallSet()
{
    Settings settings;
    settings.blockSizes = {40, 128};
    settings.blocks = 3;
    return settings;
}

std::vector<Stimulus> stimuliOf(const Settings& settings)
{
    std::vector<Stimulus> stimuli;
    forEachStimulus(settings, [&](const Stimulus& stimulus) { stimuli.push_back(stimulus); });
    return stimuli;
}

Stimulus named(const Settings& settings, const std::string& name)
{
    const std::vector<Stimulus> stimuli = stimuliOf(settings);
    const auto found =
        std::find_if(stimuli.begin(), stimuli.end(), [&](const Stimulus& each) { return each.name == name; });
    return found == stimuli.end() ? Stimulus{} : *found;
}

TEST(VectorBlocks, HaveKAndFourPositions)
{
    for (const Stimulus& stimulus : stimuliOf(smallSet())) {
        for (const auto& stream : stimulus.streams) {
            EXPECT_EQ(stream.size(), stimulus.K + 4) << stimulus.name;
        }
    }
}

TEST(VectorBlocks, BeginWithTheFramesOfASimulation)
{
    const std::vector<Stimulus> stimuli = stimuliOf(smallSet());
    for (const std::size_t i : {0U, 1U, 2U, 3U, 4U, 5U}) {
        const unsigned K = i < 3 ? 40 : 128;
        morvik::link::Frames frames;
        morvik::link::FrameSource(K, 1000, 8, 1).make(i % 3, 1, frames);
        EXPECT_EQ(stimuli[i].name, "random");
        EXPECT_EQ(stimuli[i].K, K);
        EXPECT_EQ(stimuli[i].streams, frames.streams) << i;
    }
    EXPECT_NE(stimuli[6].name, "random");
}

TEST(VectorBlocks, CountTags)
{
    Settings settings = smallSet();
    settings.generics.C_TAG_WIDTH = 2;
    const std::vector<Stimulus> stimuli = stimuliOf(settings);
    for (std::uint32_t i = 0; i < 10; ++i) {
        EXPECT_EQ(stimuli[i].tag, i % 4);
    }
}

TEST(VectorBlocks, HoldTheDirectedOnesOnlyWhenAskedFor)
{
    Settings settings = smallSet();
    settings.directed = false;
    EXPECT_EQ(stimuliOf(settings).size(), 6U);
}

TEST(VectorBlocks, HaveEachPatternForEachSize)
{
    std::map<std::string, std::set<unsigned>> sizes;
    for (const Stimulus& stimulus : stimuliOf(smallSet())) {
        sizes[stimulus.name].insert(stimulus.K);
    }
    for (const char* const name : {"zeros",
                                   "highest",
                                   "lowest",
                                   "ties",
                                   "alternating_positions",
                                   "alternating_streams",
                                   "opposed_parities",
                                   "opposed_tail",
                                   "saturated_code_word"}) {
        EXPECT_EQ(sizes[name], (std::set<unsigned>{40, 128})) << name;
    }
}

TEST(VectorBlocks, HoldTheValuesThatTheirNamesSay)
{
    const std::map<std::string, std::set<int>> values = {{"zeros", {0}},
                                                         {"highest", {127}},
                                                         {"lowest", {-128}},
                                                         {"ties", {-1, 0, 1}},
                                                         {"alternating_positions", {-128, 127}},
                                                         {"alternating_streams", {-128, 127}},
                                                         {"saturated_code_word", {-128, 127}}};
    for (const auto& [name, expected] : values) {
        for (const auto& stream : named(smallSet(), name).streams) {
            EXPECT_EQ(std::set<int>(stream.begin(), stream.end()), expected) << name;
        }
    }
    const Stimulus alternating = named(smallSet(), "alternating_positions");
    EXPECT_EQ(alternating.streams[0][0], 127);
    EXPECT_EQ(alternating.streams[0][1], -128);
    EXPECT_EQ(alternating.streams[0], alternating.streams[1]);
    const Stimulus streams = named(smallSet(), "alternating_streams");
    EXPECT_EQ(streams.streams[0][0], 127);
    EXPECT_EQ(streams.streams[1][0], -128);
    EXPECT_EQ(streams.streams[2][0], 127);
    const Stimulus opposed = named(smallSet(), "opposed_parities");
    EXPECT_EQ(opposed.streams[1][7], -128);
    EXPECT_EQ(opposed.streams[2][7], 127);
    for (const auto& stream : named(smallSet(), "opposed_tail").streams) {
        EXPECT_EQ(std::vector<int>(stream.end() - 5, stream.end()), (std::vector<int>{-128, 127, 127, 127, 127}));
    }
}

TEST(VectorBlocks, HaveASizeOnEachSideOfAnEdge)
{
    // Two rows from 72 on, one row of more segments at 128, 256 and 512; eight segments are the most. Three rows from
    // 1056 on, four from 1568 on.
    const std::vector<unsigned> two = {
        40, 64, 72, 120, 128, 136, 248, 256, 264, 504, 512, 528, 1024, 1056, 1536, 1568, 6144};
    EXPECT_EQ(edgeSizes(2), two);
    const std::vector<unsigned> eight = edgeSizes(8);
    for (const unsigned K : {2016U, 2048U, 2112U, 4096U, 4160U, 6144U}) {
        EXPECT_EQ(std::count(eight.begin(), eight.end(), K), 1) << K;
    }
}

TEST(VectorBlocks, HaveTheTagsAroundTheLargest)
{
    EXPECT_EQ(edgeTags(8), (std::vector<std::uint32_t>{0, 1, 255, 256, 257, 0xFFFFFFFF}));
    EXPECT_EQ(edgeTags(1), (std::vector<std::uint32_t>{0, 1, 2, 3, 0xFFFFFFFF}));
    EXPECT_EQ(edgeTags(32), (std::vector<std::uint32_t>{0, 1, 0xFFFFFFFF}));
}

TEST(VectorBlocks, DifferBySeed)
{
    Settings settings = smallSet();
    settings.seed = 2;
    EXPECT_NE(stimuliOf(settings)[0].streams, stimuliOf(smallSet())[0].streams);
}

}  // namespace

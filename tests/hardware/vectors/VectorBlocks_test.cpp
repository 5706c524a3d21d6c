// The blocks of vectors: which there are, and what the directed ones look like.
#include <gtest/gtest.h>

#include <algorithm>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "VectorSet.h"
#include "hardware/vectors/Blocks.h"
#include "hardware/vectors/Core.h"
#include "hardware/vectors/Cover.h"
#include "link/FrameSource.h"
#include "support/PlainLink.h"

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

// ---- Transport blocks

/// The transport block whose code blocks these decisions are, by clause 5.1.2.
morvik::plain::Bits transportBlockOf(unsigned A, const std::vector<std::vector<std::uint8_t>>& codeBlocks)
{
    const morvik::plain::CodeBlockSizes cut = morvik::plain::codeBlockSizes(A);
    morvik::plain::Bits bits;
    for (std::size_t r = 0; r < codeBlocks.size(); ++r) {
        const std::ptrdiff_t fillers = r == 0 ? static_cast<std::ptrdiff_t>(cut.F) : 0;
        bits.insert(bits.end(), codeBlocks[r].begin() + fillers, codeBlocks[r].end() - (cut.C > 1 ? 24 : 0));
    }
    bits.resize(A);
    return bits;
}

/// The soft values of a transport block's code blocks, one after the other, each stream after stream, if every value
/// that a transmission brings is at an end of a soft buffer of `width` bits.
std::vector<int> saturatedValues(const morvik::plain::Format& format,
                                 const morvik::plain::Bits& block,
                                 const std::vector<unsigned>& versions,
                                 unsigned width)
{
    const morvik::plain::CodeBlockSizes cut = morvik::plain::codeBlockSizes(format.A);
    std::vector<std::size_t> starts = {0};
    for (unsigned r = 0; r < cut.C; ++r) {
        starts.push_back(starts.back() + std::size_t{3} * (cut.size(r) + 4));
    }
    std::vector<int> values(starts.back());
    for (unsigned k = 0; k < cut.F; ++k) {
        values[k] = -128;
        values[cut.size(0) + 4 + k] = -128;
    }
    const int end = 1 << (width - 1);
    for (const unsigned version : versions) {
        const morvik::plain::Bits coded = morvik::plain::encode(format, version, block);
        const std::vector<morvik::plain::Place> places = morvik::plain::codedPlaces(format, version);
        for (std::size_t i = 0; i < coded.size(); ++i) {
            const std::size_t at = starts[places[i].r] + places[i].stream * (cut.size(places[i].r) + 4) + places[i].k;
            values[at] = std::clamp(values[at] + (coded[i] != 0 ? end - 1 : -end), -end, end - 1);
        }
    }
    return values;
}

/// Without noise, every value that arrives is at an end of a narrow soft buffer, so a second model of the standard's
/// clauses tells all soft values: punctured, repeated, filler bits, combined.
TEST(VectorBlocks, AreThoseOfTransportBlocksBehindRateRecovery)
{
    struct Case {
        unsigned A, G, NIR, width;
        std::vector<unsigned> versions;
    };
    for (const Case& each : {Case{16, 60, 0, 4, {0}},             // repeated: 8 symbols more than bits
                             Case{41, 88, 0, 4, {0, 2}},          // with filler bits
                             Case{104, 150, 0, 7, {0, 2, 3, 1}},  // punctured
                             Case{6121, 6960, 12000, 6, {1, 0}},  // two code blocks, limited buffer
                             Case{104, 1200, 250, 8, {3, 3}}}) {  // repeated beyond a limited buffer
        SCOPED_TRACE(each.A);
        morvik::simulation::LinkFormat format;
        format.transportBlockSize = each.A;
        format.codedBits = each.G;
        format.modulation = morvik::link::Modulation::qpsk;
        format.versions = each.versions;
        format.softBufferBits = each.width;
        format.softBufferSize = each.NIR;
        Settings settings;
        settings.transport = {morvik::support::transportPoint(format, 50000)};
        settings.blocks = 2;
        settings.directed = false;
        const morvik::plain::Format plain = {each.A, each.G, 2, 1, each.NIR};
        morvik::vectors::Core core(settings);
        const std::vector<Stimulus> stimuli = stimuliOf(settings);
        const std::size_t C = morvik::plain::codeBlockSizes(each.A).C;
        ASSERT_EQ(stimuli.size(), 2 * each.versions.size() * C);
        for (std::size_t first = 0; first < stimuli.size(); first += each.versions.size() * C) {
            // After the last transmission, everything decodes.
            std::vector<std::vector<std::uint8_t>> decided;
            for (std::size_t r = 0; r < C; ++r) {
                decided.push_back(core.expect(stimuli[first + (each.versions.size() - 1) * C + r]).bits);
            }
            const morvik::plain::Bits sent = transportBlockOf(each.A, decided);
            for (std::size_t t = 0; t < each.versions.size(); ++t) {
                std::vector<int> values;
                for (std::size_t r = 0; r < C; ++r) {
                    const Stimulus& stimulus = stimuli[first + t * C + r];
                    EXPECT_EQ(stimulus.origin->transmissions, t + 1);
                    EXPECT_EQ(stimulus.origin->codeBlock, r);
                    for (const auto& stream : stimulus.streams) {
                        values.insert(values.end(), stream.begin(), stream.end());
                    }
                }
                const auto end = each.versions.begin() + static_cast<std::ptrdiff_t>(t) + 1;
                EXPECT_EQ(values, saturatedValues(plain, sent, {each.versions.begin(), end}, each.width)) << t;
            }
        }
    }
}

TEST(VectorBlocks, OfTransportBlocksHaveDirectedOnesOfTheirSizes)
{
    morvik::simulation::LinkFormat format;
    format.transportBlockSize = 6121;
    format.codedBits = 9000;
    format.versions = {0};
    Settings settings;
    settings.transport = {morvik::support::transportPoint(format, 50000)};
    settings.blocks = 1;
    std::set<unsigned> sizes;
    for (const Stimulus& stimulus : stimuliOf(settings)) {
        EXPECT_EQ(stimulus.origin.has_value(), stimulus.name == "rate_recovered");
        if (stimulus.name == "zeros") {
            sizes.insert(stimulus.K);
        }
    }
    EXPECT_EQ(sizes, (std::set<unsigned>{3072, 3136}));
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

TEST(VectorBlocks, ThatAreDrawnMeetAllAndEachSomethingNew)
{
    Settings settings;
    settings.cover = {"all"};
    settings.iterations = 2;
    morvik::vectors::Core core(settings);
    morvik::coverage::Counts counts;
    std::vector<Stimulus> kept;
    cover(settings, core, counts, [&kept](const Stimulus& stimulus) { kept.push_back(stimulus); });
    EXPECT_TRUE(uncovered(settings, counts).empty());
    EXPECT_EQ(counts.blocks(), kept.size());
    morvik::coverage::Counts sum;
    for (const Stimulus& stimulus : kept) {
        EXPECT_EQ(stimulus.name, "cover");
        const std::size_t before = uncovered(settings, sum).size();
        sum.add(core.situations(stimulus));
        EXPECT_LT(uncovered(settings, sum).size(), before);
    }
    EXPECT_EQ(textOf(sum), textOf(counts));
}

TEST(VectorBlocks, AreDrawnOfTheSizesThatAreGiven)
{
    Settings settings = smallSet();
    std::set<unsigned> sizes;
    for (std::uint64_t number = 0; number < 24; ++number) {
        const Stimulus stimulus = morvik::vectors::drawn(settings, number);
        sizes.insert(stimulus.K);
        for (const auto& stream : stimulus.streams) {
            EXPECT_EQ(stream.size(), stimulus.K + 4);
        }
        settings.seed = 2;
        EXPECT_NE(morvik::vectors::drawn(settings, number).streams, stimulus.streams) << number;
        settings.seed = 1;
    }
    EXPECT_EQ(sizes, (std::set<unsigned>{40, 128}));
    settings.blockSizes.clear();
    EXPECT_EQ(coverSizes(settings), edgeSizes(2));
}

TEST(VectorBlocks, DifferBySeed)
{
    Settings settings = smallSet();
    settings.seed = 2;
    EXPECT_NE(stimuliOf(settings)[0].streams, stimuliOf(smallSet())[0].streams);
}

}  // namespace

// The situations of the arithmetic: their list, their counts, and files of counts.
#include <gtest/gtest.h>

#include <algorithm>
#include <set>
#include <sstream>
#include <string>
#include <vector>

#include "PlainSituations.h"
#include "base/Error.h"
#include "hardware/coverage/Counts.h"
#include "rules/BlockSizes.h"
#include "support/Blocks.h"

namespace morvik {
namespace {

using coverage::situations;

veltra_ip_morvik_v1_0_generics genericsOf(unsigned units, unsigned algorithm)
{
    auto generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = static_cast<int>(units);
    generics.C_ALGORITHM_TYPE = static_cast<int>(algorithm);
    return generics;
}

coverage::CoreCounts countsOf(const blocks::Block& block, unsigned units, unsigned algorithm, unsigned iterations)
{
    std::ostringstream warnings;
    return coverage::countsOf(comparison::computeModel(
        {block.sys, block.par1, block.par2}, genericsOf(units, algorithm), iterations, warnings));
}

void expectPlain(const blocks::Block& block, unsigned units, unsigned algorithm, unsigned iterations)
{
    SCOPED_TRACE("K = " + std::to_string(block.sys.size() - 4) + ", " + std::to_string(units) + " units, algorithm " +
                 std::to_string(algorithm));
    const coverage::CoreCounts counts = countsOf(block, units, algorithm, iterations);
    plain::NamedCounts plain = plain::plainSituations(block, units, algorithm, iterations);
    for (std::size_t i = 0; i < situations().size(); ++i) {
        EXPECT_EQ(counts.met[i], plain[situations()[i].name]) << situations()[i].name;
        plain.erase(situations()[i].name);
    }
    for (const auto& [name, count] : plain) {
        EXPECT_EQ(count, 0U) << name << " is not in the list";
    }
}

TEST(Situations, AreCountedAsThePlainDecoderMeetsThem)
{
    blocks::Random random(11);
    for (const unsigned algorithm : {0U, 1U, 2U}) {
        expectPlain(blocks::randomBlock(random, 40, blocks::Values::small), 2, algorithm, 3);
        expectPlain(blocks::randomBlock(random, 64, blocks::Values::extreme), 4, algorithm, 2);
        expectPlain(blocks::randomBlock(random, 136, blocks::Values::uniform), 2, algorithm, 3);
        expectPlain(blocks::randomBlock(random, 1536, blocks::Values::small), 2, algorithm, 2);
        blocks::Block sent = blocks::encode(blocks::randomBits(random, 2112), 24);
        blocks::addNoise(random, 24, sent);
        expectPlain(sent, 8, algorithm, 2);
    }
    expectPlain(blocks::randomBlock(random, 6144, blocks::Values::saturating), 8, 2, 1);
}

TEST(Situations, HaveNamesOfTheirOwnAndRulesInOrder)
{
    std::set<std::string> names;
    unsigned rule = 0;
    for (const coverage::Situation& each : situations()) {
        EXPECT_TRUE(names.insert(each.name).second) << each.name;
        EXPECT_GE(each.rule, rule) << each.name;
        EXPECT_EQ((each.name + each.text).find('%'), std::string::npos) << each.name << ": " << each.text;
        rule = each.rule;
    }
}

TEST(Situations, AreFoundByNamesAndTheirBeginnings)
{
    EXPECT_EQ(coverage::situationsNamed("all").size(), situations().size());
    EXPECT_EQ(coverage::situationsNamed("tie").size(), 30U);
    EXPECT_EQ(coverage::situationsNamed("tie.forward").size(), 8U);
    EXPECT_EQ(coverage::situationsNamed("tie.forward.3").size(), 1U);
    for (const char* none : {"", "ti", "tie.", "tie.forward.8", "All"}) {
        EXPECT_TRUE(coverage::situationsNamed(none).empty()) << none;
    }
}

TEST(Situations, ThatACoreCannotMeetHaveAReason)
{
    const auto why = [](const char* name, unsigned units, unsigned algorithm) {
        return coverage::whyImpossible(coverage::situationsNamed(name).at(0), {units, algorithm}).value_or("");
    };
    EXPECT_EQ(why("table.ratio.0.positive", 2, 1), "scaled has no table");
    EXPECT_EQ(why("table.ratio.0.positive", 2, 2), "");
    EXPECT_EQ(why("extrinsic.inside.above", 2, 2), "table does not scale");
    EXPECT_EQ(why("extrinsic.inside.above", 2, 1), "");
    EXPECT_EQ(why("segments.16", 2, 0), "no block size gives it on 2 units");
    EXPECT_EQ(why("segments.16", 4, 0), "");
    EXPECT_EQ(why("rows.more", 8, 0), "no block size gives it on 8 units");  // 6144 bits are 32 segments of 192
    EXPECT_EQ(why("rows.more", 4, 0), "");
    EXPECT_EQ(why("core.table", 4, 0), "the core is another one");
    EXPECT_EQ(why("tie.forward.0", 4, 0), "");
}

/// Families of windows take for granted that halves are equal (rule 18).
TEST(Situations, KnowAllKindsOfWindows)
{
    for (const rules::BlockSize& size : rules::blockSizes) {
        for (const unsigned units : {2U, 4U, 8U}) {
            const rules::Cut cut(size.K, units);
            const unsigned last = cut.rows() - 1;
            EXPECT_TRUE(cut.rows() == 1 || cut.windowLength(last) == 64 ||
                        cut.windowLength(last) == cut.windowLength(last - 1))
                << size.K;
        }
    }
}

TEST(Situations, OfBlocksAreSummedForEachCore)
{
    blocks::Random random(3);
    const coverage::CoreCounts one = countsOf(blocks::randomBlock(random, 40, blocks::Values::uniform), 2, 0, 1);
    const coverage::CoreCounts other = countsOf(blocks::randomBlock(random, 48, blocks::Values::small), 2, 0, 1);
    const coverage::CoreCounts third = countsOf(blocks::randomBlock(random, 40, blocks::Values::small), 4, 2, 1);
    coverage::Counts counts;
    for (const auto& each : {one, other, third}) {
        counts.add(each);
    }
    ASSERT_EQ(counts.cores().size(), 2U);
    EXPECT_EQ(counts.cores()[0].blocks, 2U);
    EXPECT_EQ(counts.blocks(), 3U);
    for (unsigned i = 0; i < situations().size(); ++i) {
        EXPECT_EQ(counts.met(i), one.met[i] + other.met[i] + third.met[i]);
        EXPECT_EQ(counts.cores()[0].met[i], one.met[i] + other.met[i]);
    }
    // What only one of the cores can meet is missing until that one does.
    const std::vector<unsigned> missing = counts.missing();
    const unsigned segments16 = coverage::situationsNamed("segments.16").at(0);
    EXPECT_EQ(std::count(missing.begin(), missing.end(), segments16), 1);
    EXPECT_TRUE(counts.whyImpossible(coverage::situationsNamed("extrinsic.inside.above").at(0)).has_value());
}

coverage::Counts read(const std::string& text)
{
    std::istringstream file(text);
    return coverage::readCounts(file, "counts.csv");
}

TEST(Situations, SurviveAFile)
{
    blocks::Random random(5);
    coverage::Counts counts;
    counts.add(countsOf(blocks::randomBlock(random, 40, blocks::Values::uniform), 2, 0, 2));
    counts.add(countsOf(blocks::randomBlock(random, 40, blocks::Values::small), 8, 2, 2));
    const std::string text = textOf(counts);
    EXPECT_EQ(textOf(read(text)), text);
}

TEST(Situations, OfBrokenFilesAreRefusedWithTheLine)
{
    coverage::Counts counts;
    counts.add(coverage::CoreCounts{{2, 1}});
    const std::string text = textOf(counts);
    const std::string core = "2,scaled,";
    const std::string header = "num_pu,algorithm,situation,count\n";
    const auto expectRefused = [](const std::string& broken, const std::string& message) {
        try {
            read(broken);
            FAIL() << "accepted: " << message;
        } catch (const base::Error& error) {
            EXPECT_EQ(error.what(), message);
        }
    };
    const auto changed = [&text](const std::string& from, const std::string& to) {
        std::string result = text;
        return result.replace(result.find(from), from.size(), to);
    };
    const std::string last = situations().back().name;
    expectRefused(header, "counts.csv:1: has no counts");
    expectRefused(changed("2,scaled,blocks", "3,scaled,blocks"), "counts.csv:2: num_pu is \"3\", expected 2, 4 or 8");
    expectRefused(changed("2,scaled,blocks", "2,soft,blocks"),
                  "counts.csv:2: algorithm is \"soft\", expected max-log, scaled or table");
    expectRefused(changed("blocks,0", "blocks,-1"),
                  "counts.csv:2: count is \"-1\", expected an integer from 0 to 2^53");
    expectRefused(changed("blocks,0", "blocks"), "counts.csv:2: has 3 fields, expected 4");
    expectRefused(changed("wrap.sum.below", "wrap.sum.beyond"),
                  "counts.csv:4: situation is \"wrap.sum.beyond\", expected wrap.sum.below");
    expectRefused(changed("2,scaled,wrap.sum.below", "4,scaled,wrap.sum.below"),
                  "counts.csv:4: is of another core than the lines before, expected wrap.sum.below of the same");
    expectRefused(
        changed(core + last + ",0\n", ""),
        "counts.csv:" + std::to_string(situations().size() + 1) + ": is the last line, expected one of " + last);
    expectRefused(text + text.substr(header.size()),
                  "counts.csv:" + std::to_string(2 * situations().size() + 3) +
                      ": ends the counts of a core that has been counted before");
}

TEST(Situations, AreSummarised)
{
    coverage::Counts counts;
    EXPECT_EQ(coverage::summary(counts), "0 of 0 met");
    coverage::CoreCounts core{{2, 0}};
    std::fill(core.met.begin(), core.met.end(), 1);
    counts.add(core);
    EXPECT_EQ(coverage::summary(counts), "126 of 126 met");
    core.met.assign(core.met.size(), 0);
    coverage::Counts none;
    none.add(core);
    EXPECT_EQ(coverage::summary(none, 2), "0 of 126 met; missing: wrap.sum.above, wrap.sum.below and 124 more");
    EXPECT_EQ(coverage::summary(none, 0), "0 of 126 met");
}

}  // namespace
}  // namespace morvik

// SelfCheck: it passes, and it fails for every wrong bit, ratio and digest.
#include "selftest/SelfCheck.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <iterator>

#include "src/InstructionSetNames.h"

namespace morvik::selftest {
namespace {

/// The library, with one instruction set alone.
Decode genericDecode(int numPu, int algorithm, const std::string& instructionSet)
{
    return instructionSet == "generic" ? libraryDecode(numPu, algorithm, instructionSet) : Decode();
}

/// The same, but for what `spoil` does to each batch of the configuration with 4 units and the table.
MakeDecode spoilt(const std::function<void(const CheckBatch&, Decided&)>& spoil)
{
    return [spoil](int numPu, int algorithm, const std::string& instructionSet) -> Decode {
        Decode decode = genericDecode(numPu, algorithm, instructionSet);
        if (!decode || numPu != 4 || algorithm != 2) {
            return decode;
        }
        return [decode, spoil](const CheckBatch& batch, Decided& decided) {
            decode(batch, decided);
            spoil(batch, decided);
        };
    };
}

/// Expects that exactly this configuration is reported, for the one instruction set that is looked at.
void expectOneDifference(const Findings& findings, int numPu, int algorithm)
{
    EXPECT_FALSE(findings.right());
    EXPECT_TRUE(findings.blocksRight);
    for (const Outcome& outcome : findings.outcomes) {
        EXPECT_EQ(outcome.available, outcome.instructionSet == "generic");
        ASSERT_EQ(outcome.differences.size(), outcome.available ? 1U : 0U);
        if (outcome.available) {
            EXPECT_EQ(outcome.differences[0].numPu, numPu);
            EXPECT_EQ(outcome.differences[0].algorithm, algorithm);
            EXPECT_NE(outcome.differences[0].expected, outcome.differences[0].found);
        }
    }
}

TEST(SelfCheck, FindsTheLibraryRight)
{
    const Findings findings = check();
    EXPECT_TRUE(findings.right());
    EXPECT_EQ(hexadecimal(findings.blockDigest), hexadecimal(promise.blocks));
    ASSERT_EQ(findings.outcomes.size(), std::size(morvik::instructionSetNames));
    bool isUsedOneAvailable = false;
    for (const Outcome& outcome : findings.outcomes) {
        const bool isEverywhere = outcome.instructionSet == "generic" || outcome.instructionSet == "component";
        EXPECT_TRUE(outcome.available || !isEverywhere) << outcome.instructionSet;
        isUsedOneAvailable = isUsedOneAvailable || (outcome.available && outcome.instructionSet == findings.inUse);
        for (const Difference& each : outcome.differences) {
            ADD_FAILURE() << outcome.instructionSet << ' ' << each.numPu << ' ' << each.algorithm << ' '
                          << hexadecimal(each.found);
        }
    }
    EXPECT_TRUE(isUsedOneAvailable) << findings.inUse;
}

TEST(SelfCheck, BlocksHaveAllSizesAndFillTheWidestVectors)
{
    const std::vector<CheckBatch> batches = checkBatches();
    ASSERT_EQ(batches.size(), 188U);
    EXPECT_EQ(batches.front().K, 40U);
    EXPECT_EQ(batches.front().blocks, 65U);
    EXPECT_EQ(batches.back().K, 6144U);
    for (const CheckBatch& batch : batches) {
        for (const auto& stream : batch.streams) {
            ASSERT_EQ(stream.size(), std::size_t{batch.blocks} * (batch.K + 4));
        }
    }
}

TEST(SelfCheck, ConfigurationsHaveDifferentDigests)
{
    std::vector<std::uint64_t> digests = {promise.blocks};
    for (const Expectation& each : promise.configurations) {
        digests.push_back(each.digest);
    }
    std::sort(digests.begin(), digests.end());
    EXPECT_EQ(std::unique(digests.begin(), digests.end()), digests.end());
}

TEST(SelfCheck, NoticesOneWrongDecision)
{
    expectOneDifference(check(promise, spoilt([](const CheckBatch& batch, Decided& decided) {
                                  if (batch.K == 2048) {
                                      decided.bits[17] ^= 1;
                                  }
                              })),
                        4,
                        2);
}

TEST(SelfCheck, NoticesTheLastStepOfTheLastRatio)
{
    expectOneDifference(check(promise, spoilt([](const CheckBatch& batch, Decided& decided) {
                                  if (batch.K == 6144) {
                                      decided.ratios.back() = static_cast<std::int16_t>(decided.ratios.back() ^ 16);
                                  }
                              })),
                        4,
                        2);
}

TEST(SelfCheck, NoticesAnotherExpectation)
{
    Promise other = promise;
    other.configurations[5].digest ^= 1;
    expectOneDifference(check(other, genericDecode), 4, 2);
}

TEST(SelfCheck, NoticesOtherBlocks)
{
    Promise other = promise;
    other.blocks ^= 1;
    const Findings findings = check(other, genericDecode);
    EXPECT_FALSE(findings.blocksRight);
    EXPECT_FALSE(findings.right());
}

TEST(SelfCheck, FailsWhereNothingIsDecoded)
{
    const Findings findings = check(promise, [](int, int, const std::string&) { return Decode(); });
    EXPECT_TRUE(findings.blocksRight);
    EXPECT_EQ(findings.configurations(), 0U);
    EXPECT_FALSE(findings.right());
}

TEST(SelfCheck, FailsWhereAConfigurationIsNotDecoded)
{
    Findings findings;
    findings.inUse = "generic";
    findings.blocksRight = true;
    for (const char* const name : {"avx2", "generic", "component"}) {
        findings.outcomes.push_back({name, true, 9, {}, 0});
    }
    EXPECT_TRUE(findings.right());
    findings.outcomes[0] = {"avx2", false, 0, {}, 0};
    EXPECT_TRUE(findings.right());
    findings.outcomes[0] = {"avx2", true, 8, {}, 0};
    EXPECT_FALSE(findings.right());
    findings.outcomes[0] = {"avx2", true, 9, {}, 0};
    findings.inUse = "avx512";
    EXPECT_FALSE(findings.right());
}

TEST(SelfCheck, DigestDependsOnEveryValue)
{
    std::vector<CheckBatch> batches = checkBatches();
    EXPECT_EQ(digestOf(batches), promise.blocks);
    batches.back().streams[2].back() = static_cast<std::int8_t>(batches.back().streams[2].back() ^ 1);
    EXPECT_NE(digestOf(batches), promise.blocks);
}

}  // namespace
}  // namespace morvik::selftest

// Tests of the conformance file: that the library decides as it says, in every way, and that it notices a wrong
// configuration.
#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <map>
#include <set>
#include <string>
#include <tuple>
#include <vector>

#include "Cases.h"
#include "support/Batches.h"

namespace {

using morvik::conformance::Case;

const std::vector<Case>& cases()
{
    static const std::vector<Case> all = [] {
        std::ifstream file(MORVIK_CONFORMANCE_BLOCKS);
        return morvik::conformance::readCases(file);
    }();
    return all;
}

std::string nameOf(const Case& each)
{
    return "K " + std::to_string(each.K) + ", " + std::to_string(each.units) + " units, algorithm " +
           std::to_string(each.algorithm) + ", " + std::to_string(each.iterations) + " iterations";
}

std::vector<std::uint8_t> decisions(const Case& each, int units, int algorithm, unsigned iterations)
{
    return morvik::blocks::Decoder(units, algorithm).decode(each.soft, iterations).bits;
}

template <class Input>
std::vector<std::uint8_t> batchDecisions(const Case& each, const std::string& set)
{
    morvik::blocks::Decoder decoder(each.units, each.algorithm);
    EXPECT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), set.c_str()), 0);
    std::vector<std::uint8_t> bits(each.K);
    morvik::blocks::BatchOutputs outputs{};
    outputs.dout = bits.data();
    outputs.dout_alloc = bits.size();
    const morvik::blocks::Batch<Input> batch({each.soft});
    EXPECT_EQ(batch.simulate(decoder.state(), each.iterations, nullptr, &outputs), 0);
    return bits;
}

TEST(Conformance, CoversEveryConfigurationInSeveralSizes)
{
    std::map<std::tuple<int, int>, std::set<unsigned>> sizes;
    for (const Case& each : cases()) {
        sizes[{each.units, each.algorithm}].insert(each.K);
    }
    ASSERT_EQ(sizes.size(), 9U);
    for (const auto& [configuration, present] : sizes) {
        EXPECT_GE(present.size(), 3U);
    }
}

TEST(Conformance, SimulateDecidesAsTheFileSays)
{
    for (const Case& each : cases()) {
        EXPECT_TRUE(decisions(each, each.units, each.algorithm, each.iterations) == each.bits) << nameOf(each);
    }
}

TEST(Conformance, EveryInstructionSetDecidesAsTheFileSays)
{
    for (const std::string& set : morvik::blocks::instructionSets()) {
        for (const Case& each : cases()) {
            EXPECT_TRUE(batchDecisions<std::int8_t>(each, set) == each.bits) << set << ", 8 bits, " << nameOf(each);
            EXPECT_TRUE(batchDecisions<std::int16_t>(each, set) == each.bits) << set << ", 16 bits, " << nameOf(each);
            EXPECT_TRUE(batchDecisions<std::int32_t>(each, set) == each.bits) << set << ", 32 bits, " << nameOf(each);
        }
    }
}

bool decidesOtherwise(const Case& each, int units, int algorithm)
{
    return decisions(each, units, algorithm, each.iterations) != each.bits;
}

// So a binding that hands a generic on wrongly fails at its own conformance test.
TEST(Conformance, EveryOtherConfigurationDecidesSomeBlockOtherwise)
{
    for (int number = 0; number < 9 * 9; ++number) {
        const int units = 2 << number % 3;
        const int algorithm = number / 3 % 3;
        const int otherUnits = 2 << number / 9 % 3;
        const int otherAlgorithm = number / 27;
        const bool same = units == otherUnits && algorithm == otherAlgorithm;
        const bool differs = std::any_of(cases().begin(), cases().end(), [&](const Case& each) {
            return each.units == units && each.algorithm == algorithm &&
                   decidesOtherwise(each, otherUnits, otherAlgorithm);
        });
        EXPECT_NE(same, differs) << units << " units, algorithm " << algorithm << ", as " << otherUnits << " units, "
                                 << otherAlgorithm;
    }
}

TEST(Conformance, OneIterationLessDecidesSomeBlockOfEachConfigurationOtherwise)
{
    for (const int units : {2, 4, 8}) {
        for (const int algorithm : {0, 1, 2}) {
            EXPECT_TRUE(std::any_of(cases().begin(),
                                    cases().end(),
                                    [&](const Case& each) {
                                        return each.units == units && each.algorithm == algorithm &&
                                               each.iterations > 1 &&
                                               decisions(each, units, algorithm, each.iterations - 1) != each.bits;
                                    }))
                << units << " units, algorithm " << algorithm;
        }
    }
}

TEST(Conformance, ReachesBothEndsOfTheSoftValues)
{
    std::set<int> values;
    for (const Case& each : cases()) {
        values.insert(each.soft.par2.begin(), each.soft.par2.end());
    }
    EXPECT_EQ(*values.begin(), -128);
    EXPECT_EQ(*values.rbegin(), 127);
}

}  // namespace

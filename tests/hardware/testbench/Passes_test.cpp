// Passes: the values of each pass against the model's own trace and the rules.
#include "hardware/testbench/Passes.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <sstream>
#include <string>
#include <vector>

#include "support/Blocks.h"
#include "support/TraceReader.h"

namespace {

using morvik::Passes;
using morvik::passSignals;

veltra_ip_morvik_v1_0_generics core(int numPu, int algorithm)
{
    auto generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = numPu;
    generics.C_ALGORITHM_TYPE = algorithm;
    return generics;
}

morvik::SoftBlock randomBlock(unsigned K)
{
    morvik::blocks::Random random(K);
    morvik::SoftBlock block;
    for (auto* const stream : {&block.rsc1Sys, &block.rsc1Par, &block.rsc2Par}) {
        for (unsigned i = 0; i < K + 4; ++i) {
            stream->push_back(morvik::blocks::between(random, -128, 127));
        }
    }
    return block;
}

/// The number of the signal that the trace calls so; branch metrics are not in it.
unsigned signalOfTrace(const std::string& name)
{
    const std::string renamed = name == "int"    ? "intrinsic"
                                : name == "ext"  ? "extrinsic"
                                : name == "llr"  ? name
                                : name[0] == 'a' ? "alpha" + name.substr(1)
                                                 : "beta" + name.substr(1);
    const auto* const found = std::find_if(
        passSignals.begin(), passSignals.end(), [&](const morvik::Signal& each) { return each.name == renamed; });
    return static_cast<unsigned>(found - passSignals.begin());
}

/// Compares all values of two iterations with the trace of a decoder.
void expectTraced(unsigned K, int numPu, int algorithm)
{
    const morvik::SoftBlock block = randomBlock(K);
    std::stringstream trace;
    morvik::Decoder decoder(core(numPu, algorithm), trace);
    decoder.armTrace(4);
    std::vector<std::uint8_t> bits;
    decoder.decode(block, 2, 0, bits);

    std::ostringstream warnings;
    Passes passes(block, core(numPu, algorithm), warnings);
    morvik::support::TraceReader reader(trace, "trace");
    unsigned rows = 0;
    for (morvik::support::TraceStep step; reader.next(step); ++rows) {
        if (step.step == 0) {
            passes.next();
        }
        for (std::size_t i = 0; i < morvik::support::traceSignals.size(); ++i) {
            const std::string name = morvik::support::traceSignals[i];
            if (name[0] != 'g') {
                ASSERT_EQ(passes.value(signalOfTrace(name), step.step), step.values[i])
                    << "K " << K << ", half-iteration " << step.halfIteration << ", step " << step.step << ' ' << name;
            }
        }
    }
    EXPECT_EQ(rows, 4 * (K + 3));
    EXPECT_EQ(warnings.str(), "");
}

TEST(Passes, GivesTheValuesOfTheTrace)
{
    for (const int algorithm : {0, 1, 2}) {
        expectTraced(40, 2, algorithm);
        expectTraced(1280, 2, algorithm);
        expectTraced(2048, 8, algorithm);
    }
}

TEST(Passes, GivesTheBranchMetricsOfTheFirstPass)
{
    const morvik::SoftBlock block = randomBlock(40);
    std::ostringstream warnings;
    Passes passes(block, core(2, 1), warnings);
    passes.next();
    constexpr unsigned g0 = morvik::signalsOf(morvik::Stage::branch).first;
    for (unsigned i = 0; i < 40; ++i) {
        const int systematic = block.rsc1Sys[(3 * i + 10 * i * i) % 40];
        const int sum = std::clamp(systematic + block.rsc2Par[i], -128, 127);
        const int difference = std::clamp(systematic - block.rsc2Par[i], -128, 127);
        EXPECT_EQ(passes.value(g0, i), sum) << i;
        EXPECT_EQ(passes.value(g0 + 1, i), difference) << i;
        EXPECT_EQ(passes.value(g0 + 2, i), difference) << i;
        EXPECT_EQ(passes.value(g0 + 3, i), sum) << i;
    }
}

TEST(Passes, KnowsWhatIsComputedInTheTail)
{
    std::ostringstream warnings;
    const Passes passes(randomBlock(40), core(2, 1), warnings);
    for (unsigned signal = 0; signal < passSignals.size(); ++signal) {
        const std::string name = passSignals[signal].name;
        const bool isForward = name.rfind("alpha", 0) == 0;
        EXPECT_TRUE(passes.isComputed(signal, 39));
        EXPECT_EQ(passes.isComputed(signal, 40), name == "intrinsic" || isForward) << name;
        EXPECT_EQ(passes.isComputed(signal, 42), name == "intrinsic") << name;
    }
}

TEST(Passes, RefusesBlocksOfNoSize)
{
    std::ostringstream warnings;
    EXPECT_THROW(Passes(randomBlock(41), core(2, 1), warnings), morvik::Refusal);
    EXPECT_THROW(Passes(randomBlock(0), core(2, 1), warnings), morvik::Refusal);
}

TEST(Passes, AlternatesTheCodes)
{
    EXPECT_EQ(morvik::constituentCode(0), 2U);
    EXPECT_EQ(morvik::constituentCode(1), 1U);
}

}  // namespace

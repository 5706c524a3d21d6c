// TraceReader: tests on the model's own trace, and on texts that are none.
#include "support/TraceReader.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <sstream>
#include <string>
#include <vector>

#include "base/Error.h"
#include "hardware/testbench/Decoder.h"

namespace {

using morvik::support::TraceReader;
using morvik::support::TraceStep;

std::vector<TraceStep> stepsOf(const std::string& text)
{
    std::istringstream input(text);
    TraceReader reader(input, "trace");
    std::vector<TraceStep> steps;
    for (TraceStep step; reader.next(step);) {
        steps.push_back(step);
    }
    return steps;
}

/// Expects that the text is refused with this message.
void expectRefused(const std::string& text, const std::string& message)
{
    try {
        stepsOf(text);
        FAIL() << "accepted";
    } catch (const morvik::base::Error& error) {
        EXPECT_EQ(error.what(), message);
    }
}

/// A row as the trace has it, with 23 times the same value, or another one behind the first.
std::string row(const std::string& number, const std::string& value, const std::string& second = "")
{
    std::string text = number;
    for (std::size_t i = 0; i < morvik::support::traceSignals.size(); ++i) {
        text += "    " + (i == 1 && !second.empty() ? second : value);
    }
    return text + '\n';
}

/// Traces a block of 40 soft values in each stream, of which each is another, with two iterations.
struct TracedBlock {
    TracedBlock()
    {
        for (int i = 0; i < 44; ++i) {
            block.rsc1Sys.push_back(i * 37 % 101 - 50);
            block.rsc1Par.push_back(i * 53 % 97 - 48);
            block.rsc2Par.push_back(i * 29 % 89 - 44);
        }
        std::ostringstream messages;
        morvik::Decoder decoder(veltra_ip_morvik_v1_0_get_default_generics(), messages);
        decoder.armTrace(4);
        decoded = decoder.decodeWithRatios(block, 2, 0);
        trace = messages.str();
    }

    morvik::SoftBlock block;
    morvik::Decoded decoded;
    std::string trace;
};

TEST(TraceReader, FindsEachStepOfEachPass)
{
    const std::vector<TraceStep> steps = stepsOf(TracedBlock().trace);
    ASSERT_EQ(steps.size(), 4U * 43);
    for (std::size_t i = 0; i < steps.size(); ++i) {
        EXPECT_EQ(steps[i].decode, 0U);
        EXPECT_EQ(steps[i].halfIteration, i / 43);
        EXPECT_EQ(steps[i].step, i % 43);
    }
}

TEST(TraceReader, FindsTheRatiosOfTheLastPass)
{
    const TracedBlock traced;
    const std::vector<TraceStep> steps = stepsOf(traced.trace);
    for (std::size_t k = 0; k < 40; ++k) {
        EXPECT_EQ(steps[std::size_t{3} * 43 + k].values[21], traced.decoded.ratios[k] / 16) << k;
    }
}

TEST(TraceReader, FindsTheIntrinsicValuesOfTheFirstPass)
{
    const TracedBlock traced;
    const std::vector<TraceStep> steps = stepsOf(traced.trace);
    // The first pass works on the interleaved code, whose position 0 is 0: half of the systematic value, in steps.
    EXPECT_EQ(steps[0].values[0], traced.block.rsc1Sys[0] / 2);
    // An encoder starts in state 0: half the most negative metric stands for all others.
    EXPECT_EQ(steps[0].values[1], 0);
    EXPECT_EQ(steps[0].values[2], -1024);
}

TEST(TraceReader, ReadsTheWholeRangeOfValues)
{
    const std::vector<TraceStep> steps =
        stepsOf("decode=7 siso=3\n" + row("0", "-256.000000", "+255.875000") + row("1", "-0.125000", "+0.000000"));
    ASSERT_EQ(steps.size(), 2U);
    EXPECT_EQ(steps[0].decode, 7U);
    EXPECT_EQ(steps[0].halfIteration, 3U);
    EXPECT_EQ(steps[0].values[0], -2048);
    EXPECT_EQ(steps[0].values[1], 2047);
    EXPECT_EQ(steps[1].values[22], -1);
    EXPECT_EQ(steps[1].values[1], 0);
}

TEST(TraceReader, FindsNothingInAnEmptyText)
{
    EXPECT_TRUE(stepsOf("").empty());
}

TEST(TraceReader, NamesThePlaceOfWhatIsNoTrace)
{
    const std::string noValue =
        " is no traced value, expected a sign and six decimals, a multiple of 1/8 from -256 to 255.875";
    const std::string pass = "decode=0 siso=0\n";
    expectRefused("hello\n", "trace:1: no line of a trace");
    expectRefused("decode=0 siso=x\n", R"(trace:1: no beginning of a pass, expected "decode=N siso=N")");
    expectRefused(pass + row("1", "+0.000000"), R"(trace:2: trellis step "1", expected 0)");
    expectRefused(pass + row("0", "+0.100000"), R"(trace:2: int "+0.100000")" + noValue);
    expectRefused(pass + row("0", "+0.000000", "0.000000"), R"(trace:2: a0 "0.000000")" + noValue);
    expectRefused(pass + row("0", "+256.000000"), R"(trace:2: int "+256.000000")" + noValue);
    expectRefused(pass + row("0", "-256.125000"), R"(trace:2: int "-256.125000")" + noValue);
    expectRefused(pass + "0    +0.000000\n", R"(trace:2: a0 "")" + noValue);
    expectRefused(pass + row("0", "+0.000000", "+0.000000  +0.000000"), "trace:2: more than 23 values");
}

}  // namespace

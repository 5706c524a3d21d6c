// The checker by its C interface: answers, messages, and what it refuses.
#include <gtest/gtest.h>
#include <sys/resource.h>
#include <unistd.h>

#include <algorithm>
#include <array>
#include <cstdlib>
#include <fstream>
#include <map>
#include <sstream>

#include "morvik_v1_0_batch.h"
#include "support/Checkers.h"
#include "support/TemporaryFolder.h"

namespace morvik::support {
namespace {

using Messages = std::vector<std::string>;

constexpr int K = 40;

morvik::blocks::Block noisyBlock(unsigned seed)
{
    morvik::blocks::Random random(seed);
    return morvik::blocks::randomBlock(random, K, morvik::blocks::Values::uniform);
}

/// A checker with a block, two iterations.
Checker started(unsigned seed = 1)
{
    Checker checker = makeChecker(2, 1);
    EXPECT_EQ(start(checker, noisyBlock(seed), 2), MORVIK_CHECKER_AGREES);
    return checker;
}

/// The same, counting situations.
Checker counting(unsigned seed = 1)
{
    Checker checker = started(seed);
    EXPECT_EQ(morvik_checker_count_situations(checker.get()), MORVIK_CHECKER_AGREES);
    return checker;
}

/// All values of a signal in all half-iterations, as the core has them.
void observeAll(const Checker& checker, int signal)
{
    for (int pass = 0; pass < 4; ++pass) {
        for (int step = 0; step < K + 3; ++step) {
            const int value = morvik_checker_value(checker.get(), signal, pass, step);
            if (value != MORVIK_CHECKER_UNKNOWN) {
                EXPECT_EQ(morvik_checker_observe(checker.get(), signal, pass, step, value), MORVIK_CHECKER_AGREES);
            }
        }
    }
}

bool has(const std::string& text, const std::string& part)
{
    return text.find(part) != std::string::npos;
}

TEST(Checker, KnowsTheRatiosOfTheLastPass)
{
    const morvik::blocks::Block block = noisyBlock(1);
    std::array<std::uint8_t, K> bits{};
    std::array<std::int16_t, K> ratios{};
    veltra_ip_morvik_v1_0_batch_outputs outputs{};
    outputs.dout = bits.data();
    outputs.dout_alloc = bits.size();
    outputs.ratios = ratios.data();
    outputs.ratios_alloc = ratios.size();
    veltra_ip_morvik_v1_0_state* const state =
        veltra_ip_morvik_v1_0_create_state(veltra_ip_morvik_v1_0_get_default_generics());
    ASSERT_EQ(veltra_ip_morvik_v1_0_batch_simulate_i32(
                  state, block.sys.data(), block.par1.data(), block.par2.data(), K + 4, 1, 2, nullptr, &outputs),
              0);
    veltra_ip_morvik_v1_0_destroy_state(state);
    const Checker checker = started();
    for (int bit = 0; bit < K; ++bit) {
        EXPECT_EQ(16 * morvik_checker_ratio(checker.get(), bit), ratios[static_cast<std::size_t>(bit)]) << bit;
    }
}

TEST(Checker, HasValuesWhereTheCoreComputesSome)
{
    const Checker checker = started();
    // Rule 10: the encoder starts in state 0.
    EXPECT_GT(morvik_checker_value(checker.get(), MORVIK_CHECKER_ALPHA, 0, 0),
              morvik_checker_value(checker.get(), MORVIK_CHECKER_ALPHA + 1, 0, 0));
    EXPECT_EQ(morvik_checker_value(checker.get(), MORVIK_CHECKER_LLR, 3, 7), morvik_checker_ratio(checker.get(), 7));
    EXPECT_EQ(morvik_checker_value(checker.get(), MORVIK_CHECKER_LLR, 3, K), MORVIK_CHECKER_UNKNOWN);
    EXPECT_NE(morvik_checker_value(checker.get(), MORVIK_CHECKER_INTRINSIC, 3, K + 2), MORVIK_CHECKER_UNKNOWN);
    EXPECT_EQ(messagesOf(checker), Messages());
}

TEST(Checker, KnowsSignalsByName)
{
    EXPECT_EQ(morvik_checker_signal("intrinsic"), MORVIK_CHECKER_INTRINSIC);
    EXPECT_EQ(morvik_checker_signal("g"), MORVIK_CHECKER_G);
    EXPECT_EQ(morvik_checker_signal("alpha7"), MORVIK_CHECKER_ALPHA + 7);
    EXPECT_EQ(morvik_checker_signal("beta"), MORVIK_CHECKER_BETA);
    EXPECT_EQ(morvik_checker_signal("extrinsic"), MORVIK_CHECKER_EXTRINSIC);
    for (const char* name : {"", "alpha8", "llr0", "ALPHA0"}) {
        EXPECT_EQ(morvik_checker_signal(name), -1) << name;
    }
    EXPECT_EQ(morvik_checker_signal(nullptr), -1);
}

TEST(Checker, TellsTheFirstDifferenceOnce)
{
    const Checker checker = started();
    const int value = morvik_checker_value(checker.get(), MORVIK_CHECKER_LLR, 0, 3);
    for (int time = 0; time < 2; ++time) {
        EXPECT_EQ(morvik_checker_observe(checker.get(), MORVIK_CHECKER_LLR, 0, 3, value ^ 1), MORVIK_CHECKER_DIFFERS);
    }
    EXPECT_EQ(morvik_checker_observe(checker.get(), MORVIK_CHECKER_LLR, 0, 4, MORVIK_CHECKER_UNKNOWN),
              MORVIK_CHECKER_DIFFERS);
    EXPECT_EQ(morvik_checker_differences(checker.get()), 2);
    EXPECT_EQ(morvik_checker_standing(checker.get()), MORVIK_CHECKER_DIFFERS);
    const Messages messages = messagesOf(checker);
    ASSERT_EQ(messages.size(), 1U);
    EXPECT_EQ(messages[0].substr(0, messages[0].find('\n')),
              "ERROR:checker:llr of half-iteration 0, step 3: expected " + std::to_string(value) + ", got " +
                  std::to_string(value ^ 1));
    EXPECT_TRUE(has(messages[0], "  half-iteration  0, on the interleaved code\n  unit            0, thread 0\n"))
        << messages[0];
    EXPECT_TRUE(has(messages[0],
                    "\nAt fault: the log-likelihood ratio (rule 8), or an operation before it that is "
                    "not in the record.\n"))
        << messages[0];
}

TEST(Checker, TakesXForADifference)
{
    const Checker checker = started();
    EXPECT_EQ(morvik_checker_observe(checker.get(), MORVIK_CHECKER_G + 1, 0, 0, MORVIK_CHECKER_UNKNOWN),
              MORVIK_CHECKER_DIFFERS);
    const Messages messages = messagesOf(checker);
    ASSERT_EQ(messages.size(), 1U);
    EXPECT_TRUE(has(messages[0], ", got x\n")) << messages[0];
    EXPECT_TRUE(has(messages[0], "\nFound in branch metrics, 1 difference:\n  unknown (x).")) << messages[0];
}

TEST(Checker, KnowsAWholeRowWhenItTells)
{
    const Checker checker = started();
    std::array<std::int32_t, 4> row{};
    for (int i = 0; i < 4; ++i) {
        row[static_cast<std::size_t>(i)] = -morvik_checker_value(checker.get(), MORVIK_CHECKER_G + i, 0, 5);
    }
    EXPECT_EQ(morvik_checker_observe_row(checker.get(), MORVIK_CHECKER_G, 0, 5, row.data()), MORVIK_CHECKER_DIFFERS);
    const Messages messages = messagesOf(checker);
    ASSERT_EQ(messages.size(), 1U);
    EXPECT_TRUE(has(messages[0], "ERROR:checker:g0 of half-iteration 0, step 5: expected ")) << messages[0];
    EXPECT_TRUE(has(messages[0], "Found in branch metrics, 4 differences")) << messages[0];
    EXPECT_TRUE(has(messages[0], "the sign is flipped")) << messages[0];
}

TEST(Checker, ComparesNothingWhereTheCoreComputesNothing)
{
    const Checker checker = started();
    EXPECT_EQ(morvik_checker_observe(checker.get(), MORVIK_CHECKER_LLR, 0, K + 1, MORVIK_CHECKER_UNKNOWN),
              MORVIK_CHECKER_AGREES);
    EXPECT_EQ(morvik_checker_seen(checker.get(), MORVIK_CHECKER_LLR), 0);
}

TEST(Checker, CountsWhatItHasSeen)
{
    const Checker checker = started();
    EXPECT_EQ(morvik_checker_standing(checker.get()), MORVIK_CHECKER_INCOMPLETE);
    EXPECT_STREQ(morvik_checker_report(checker.get()), "block 0: nothing has been observed");
    observeAll(checker, MORVIK_CHECKER_LLR);
    EXPECT_EQ(morvik_checker_standing(checker.get()), MORVIK_CHECKER_AGREES);
    EXPECT_EQ(morvik_checker_seen(checker.get(), MORVIK_CHECKER_LLR), 4 * K);
    EXPECT_EQ(morvik_checker_expected(checker.get(), MORVIK_CHECKER_LLR), 4 * K);
    EXPECT_EQ(morvik_checker_expected(checker.get(), MORVIK_CHECKER_ALPHA), 4 * (K + 1));
    EXPECT_EQ(morvik_checker_expected(checker.get(), MORVIK_CHECKER_INTRINSIC), 4 * (K + 3));
    const int value = morvik_checker_value(checker.get(), MORVIK_CHECKER_INTRINSIC, 0, 0);
    morvik_checker_observe(checker.get(), MORVIK_CHECKER_INTRINSIC, 0, 0, value);
    EXPECT_EQ(morvik_checker_standing(checker.get()), MORVIK_CHECKER_INCOMPLETE);
    EXPECT_STREQ(morvik_checker_report(checker.get()),
                 "block 0: compared 4 of 4 half-iterations, 161 of 3724 values: all equal to the model\n"
                 "  not in the record: 171 values of intrinsic; the first is intrinsic of half-iteration 0, step 1\n"
                 "  not in the record: signals g0 to g3, alpha0 to alpha7, beta0 to beta7, extrinsic\n"
                 "\n"
                 "signal      compared  missing  unknown  differences   faults   first difference\n"
                 "intrinsic          1      171        0            0        0\n"
                 "llr              160        0        0            0        0");
    EXPECT_EQ(messagesOf(checker), Messages());
}

/// The counts of a file of `num_pu,algorithm,situation,count`, by situation.
std::map<std::string, std::uint64_t> countsOf(const std::string& file)
{
    std::map<std::string, std::uint64_t> counts;
    std::istringstream lines(file);
    for (std::string line; std::getline(lines, line);) {
        const std::size_t last = line.rfind(',');
        const std::size_t name = line.rfind(',', last - 1) + 1;
        counts[line.substr(name, last - name)] = std::strtoull(line.c_str() + last + 1, nullptr, 10);
    }
    return counts;
}

TEST(Checker, CountsSituationsOnlyWhenAskedTo)
{
    const Checker checker = started();
    const TemporaryFolder folder;
    observeAll(checker, MORVIK_CHECKER_LLR);
    EXPECT_FALSE(has(morvik_checker_report(checker.get()), "situations"));
    EXPECT_STREQ(morvik_checker_situations(checker.get()), "");
    EXPECT_EQ(morvik_checker_write_situations(checker.get(), folder.path("met.csv").c_str()), MORVIK_CHECKER_REFUSED);
    const std::string refusal = "ERROR:checker:Situations are counted only if count_situations asks for it";
    EXPECT_EQ(messagesOf(checker), (Messages{refusal, refusal}));
}

TEST(Checker, CountsTheSituationsOfTheBlockUnderWay)
{
    const Checker early = counting();
    const Checker late = started();
    observeAll(early, MORVIK_CHECKER_LLR);
    observeAll(late, MORVIK_CHECKER_LLR);
    for (int time = 0; time < 2; ++time) {
        EXPECT_EQ(morvik_checker_count_situations(late.get()), MORVIK_CHECKER_AGREES);
        EXPECT_STREQ(morvik_checker_situations(late.get()), morvik_checker_situations(early.get()));
    }
    const std::string report = morvik_checker_report(late.get());
    EXPECT_TRUE(has(report, "\nsituations: 22 of 130 met, in 1 block")) << report;
    EXPECT_EQ(messagesOf(late), Messages());
}

/// Blocks that ended before the call are not counted.
TEST(Checker, CountsSituationsFromTheCallOn)
{
    const Checker checker = started(1);
    observeAll(checker, MORVIK_CHECKER_LLR);
    ASSERT_EQ(start(checker, noisyBlock(2), 2), MORVIK_CHECKER_AGREES);
    ASSERT_EQ(morvik_checker_count_situations(checker.get()), MORVIK_CHECKER_AGREES);
    observeAll(checker, MORVIK_CHECKER_LLR);
    const Checker other = counting(2);
    observeAll(other, MORVIK_CHECKER_LLR);
    EXPECT_STREQ(morvik_checker_situations(checker.get()), morvik_checker_situations(other.get()));
}

TEST(Checker, CountsTheSituationsOfAllBlocks)
{
    const Checker checker = counting(1);
    const std::string nothing = morvik_checker_situations(checker.get());
    EXPECT_EQ(nothing.rfind("num_pu,algorithm,situation,count\n2,scaled,blocks,0\n2,scaled,wrap.sum.above,0\n", 0), 0U);
    for (int signal = 0; signal < MORVIK_CHECKER_SIGNALS; ++signal) {
        observeAll(checker, signal);
    }
    auto first = countsOf(morvik_checker_situations(checker.get()));
    EXPECT_EQ(first["blocks"], 1U);
    EXPECT_EQ(first["pass.later.natural"], 40U);
    EXPECT_GT(first["wrap.sum.above"], 0U);
    ASSERT_EQ(start(checker, noisyBlock(1), 2), MORVIK_CHECKER_AGREES);
    for (int signal = 0; signal < MORVIK_CHECKER_SIGNALS; ++signal) {
        observeAll(checker, signal);
    }
    for (const auto& [name, count] : countsOf(morvik_checker_situations(checker.get()))) {
        EXPECT_EQ(count, 2 * first[name]) << name;
    }
}

TEST(Checker, CountsSituationsAtRightValuesAlone)
{
    const Checker checker = counting(1);
    const auto decided = [&checker] {
        auto counts = countsOf(morvik_checker_situations(checker.get()));
        return counts["decision.zero"] + counts["decision.one"] + counts["decision.none"];
    };
    EXPECT_EQ(decided(), 0U);
    for (const int step : {3, 4}) {
        morvik_checker_observe(checker.get(), MORVIK_CHECKER_LLR, 3, step, morvik_checker_ratio(checker.get(), step));
    }
    morvik_checker_observe(checker.get(), MORVIK_CHECKER_LLR, 3, 5, morvik_checker_ratio(checker.get(), 5) ^ 1);
    EXPECT_EQ(decided(), 2U);
    auto counts = countsOf(morvik_checker_situations(checker.get()));
    EXPECT_EQ(counts["pass.later.natural"], 2U);
    EXPECT_EQ(counts["segments.1"], 1U);
    EXPECT_EQ(counts["branch.negated"], 0U);
    EXPECT_EQ(counts["input.tail.highest"], 0U);
}

/// g3 is g0, and a test bench may observe either.
TEST(Checker, CountsTheSituationsOfTwins)
{
    const Checker both[] = {counting(1), counting(1)};
    observeAll(both[0], MORVIK_CHECKER_G);
    observeAll(both[1], MORVIK_CHECKER_G + 3);
    EXPECT_GT(countsOf(morvik_checker_situations(both[0].get()))["branch.g0.above"], 0U);
    EXPECT_STREQ(morvik_checker_situations(both[0].get()), morvik_checker_situations(both[1].get()));
}

TEST(Checker, WritesSituations)
{
    const Checker checker = counting(1);
    observeAll(checker, MORVIK_CHECKER_LLR);
    const TemporaryFolder folder;
    EXPECT_EQ(morvik_checker_write_situations(checker.get(), folder.path("met.csv").c_str()), MORVIK_CHECKER_AGREES);
    EXPECT_EQ(folder.read("met.csv"), morvik_checker_situations(checker.get()));
    EXPECT_EQ(morvik_checker_write_situations(checker.get(), folder.path("no/met.csv").c_str()),
              MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(morvik_checker_write_situations(checker.get(), nullptr), MORVIK_CHECKER_REFUSED);
    const Messages messages = messagesOf(checker);
    ASSERT_EQ(messages.size(), 2U);
    EXPECT_TRUE(has(messages[0], "no/met.csv")) << messages[0];
    EXPECT_EQ(messages[1], "ERROR:checker:The file name is a null pointer");
    EXPECT_EQ(morvik_checker_count_situations(nullptr), MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(morvik_checker_write_situations(nullptr, "met.csv"), MORVIK_CHECKER_REFUSED);
    EXPECT_STREQ(morvik_checker_situations(nullptr), "");
}

TEST(Checker, BeginsAnewWithEachBlock)
{
    const Checker checker = started(1);
    const int first = morvik_checker_ratio(checker.get(), 3);
    morvik_checker_observe(checker.get(), MORVIK_CHECKER_LLR, 3, 3, first ^ 1);
    messagesOf(checker);
    ASSERT_EQ(start(checker, noisyBlock(2), 2), MORVIK_CHECKER_AGREES);
    EXPECT_EQ(morvik_checker_differences(checker.get()), 0);
    EXPECT_EQ(morvik_checker_seen(checker.get(), MORVIK_CHECKER_LLR), 0);
    const int second = morvik_checker_ratio(checker.get(), 3);
    EXPECT_NE(second, first);
    EXPECT_EQ(morvik_checker_observe(checker.get(), MORVIK_CHECKER_LLR, 3, 3, first), MORVIK_CHECKER_DIFFERS);
    const Messages messages = messagesOf(checker);
    ASSERT_EQ(messages.size(), 1U);
    EXPECT_TRUE(has(messages[0], "First difference, in the order of computation (block 1):")) << messages[0];
}

TEST(Checker, IsIndependentOfOthers)
{
    const Checker one = started(1);
    const Checker other = started(2);
    const int value = morvik_checker_ratio(one.get(), 0);
    ASSERT_NE(value, morvik_checker_ratio(other.get(), 0));
    EXPECT_EQ(morvik_checker_observe(one.get(), MORVIK_CHECKER_LLR, 3, 0, value), MORVIK_CHECKER_AGREES);
    EXPECT_EQ(morvik_checker_observe(other.get(), MORVIK_CHECKER_LLR, 3, 0, value), MORVIK_CHECKER_DIFFERS);
    EXPECT_EQ(messagesOf(one), Messages());
    EXPECT_EQ(messagesOf(other).size(), 1U);
}

TEST(Checker, RefusesPlacesAndValuesThatDoNotExist)
{
    const Checker checker = started();
    const std::array<std::int32_t, 8> row = {0, 0, 0, 0, 0, 0, 0, 2048};
    const auto observe = [&](int signal, int pass, int step, int value) {
        EXPECT_EQ(morvik_checker_observe(checker.get(), signal, pass, step, value), MORVIK_CHECKER_REFUSED);
    };
    observe(23, 0, 0, 0);
    observe(-1, 0, 0, 0);
    observe(0, 4, 0, 0);
    observe(0, 0, K + 3, 0);
    observe(MORVIK_CHECKER_ALPHA, 0, 0, 3840);
    EXPECT_EQ(morvik_checker_observe_row(checker.get(), MORVIK_CHECKER_ALPHA, 0, 0, row.data()),
              MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(morvik_checker_observe_row(checker.get(), MORVIK_CHECKER_ALPHA + 3, 0, 0, row.data()),
              MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(morvik_checker_observe_row(checker.get(), MORVIK_CHECKER_ALPHA, 0, 0, nullptr), MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(morvik_checker_value(checker.get(), 0, 0, -1), MORVIK_CHECKER_UNKNOWN);
    EXPECT_EQ(morvik_checker_ratio(checker.get(), K), MORVIK_CHECKER_UNKNOWN);
    EXPECT_EQ(messagesOf(checker),
              (Messages{"ERROR:checker:Signal 23 is not allowed, expected 0 to 22",
                        "ERROR:checker:Signal -1 is not allowed, expected 0 to 22",
                        "ERROR:checker:Half-iteration 4 is not allowed, expected 0 to 3",
                        "ERROR:checker:Step 43 is not allowed, expected 0 to 42",
                        "ERROR:checker:alpha0 3840 is not allowed, expected -2048 to 2047: eighths, a register's bits "
                        "in two's complement, sign-extended",
                        "ERROR:checker:alpha7 2048 is not allowed, expected -2048 to 2047: eighths, a register's bits "
                        "in two's complement, sign-extended",
                        "ERROR:checker:alpha3 is not the first of its row, alpha0",
                        "ERROR:checker:The row is a null pointer",
                        "ERROR:checker:Step -1 is not allowed, expected 0 to 42",
                        "ERROR:checker:Bit 40 is not allowed, expected 0 to 39"}));
    EXPECT_EQ(morvik_checker_differences(checker.get()), 0);
    EXPECT_EQ(morvik_checker_seen(checker.get(), MORVIK_CHECKER_ALPHA), 0);
}

TEST(Checker, NeedsABlockFirst)
{
    const Checker checker = makeChecker(2, 1);
    const std::string refusal = "ERROR:checker:There is no block: start comes before values are observed or asked for";
    EXPECT_EQ(morvik_checker_observe(checker.get(), 0, 0, 0, 0), MORVIK_CHECKER_REFUSED);
    EXPECT_STREQ(morvik_checker_report(checker.get()), "");
    EXPECT_EQ(morvik_checker_standing(checker.get()), MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(messagesOf(checker), (Messages{refusal, refusal}));
}

TEST(Checker, ForgetsItsBlockWhenTold)
{
    const Checker checker = started();
    morvik_checker_put(checker.get(), 1, 2, 3);
    morvik_checker_forget(checker.get());
    EXPECT_EQ(morvik_checker_standing(checker.get()), MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(morvik_checker_expected(checker.get(), MORVIK_CHECKER_LLR), 0);
    EXPECT_EQ(messagesOf(checker), Messages());
    EXPECT_EQ(start(checker, noisyBlock(1), 2), MORVIK_CHECKER_AGREES);
    const Checker refused = makeChecker(3, 1);
    morvik_checker_forget(refused.get());
    EXPECT_EQ(messagesOf(refused).size(), 1U);
}

TEST(Checker, RefusesBlocksThatTheCoreDoesNotDecode)
{
    const Checker checker = started();
    EXPECT_EQ(start(checker, {}, 2), MORVIK_CHECKER_REFUSED);
    morvik::blocks::Block block = noisyBlock(1);
    for (const int iterations : {0, 16}) {
        EXPECT_EQ(start(checker, block, iterations), MORVIK_CHECKER_REFUSED);
    }
    for (auto* stream : {&block.sys, &block.par1, &block.par2}) {
        stream->resize(K);
    }
    EXPECT_EQ(start(checker, block, 2), MORVIK_CHECKER_REFUSED);
    for (auto* stream : {&block.sys, &block.par1, &block.par2}) {
        stream->resize(7000);
    }
    EXPECT_EQ(start(checker, block, 2), MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(messagesOf(checker),
              (Messages{"ERROR:checker:The block is empty, but a block of K bits has K + 4 soft values in each stream",
                        "ERROR:checker:0 iterations are not allowed, expected 1 to 15",
                        "ERROR:checker:16 iterations are not allowed, expected 1 to 15",
                        "ERROR:checker:Block size not supported: 40 soft values in each stream, but a block of 40 bits "
                        "has 44, the tail included",
                        "ERROR:checker:Block size not supported: 7000 soft values in each stream are not K + 4 for a "
                        "block size K of 3GPP TS 36.212"}));
    // The block before is gone as well.
    EXPECT_EQ(morvik_checker_standing(checker.get()), MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(start(checker, noisyBlock(1), 2), MORVIK_CHECKER_AGREES);
}

TEST(Checker, TellsWhyAConfigurationIsRefused)
{
    const Checker checker = makeChecker(3, 1);
    ASSERT_TRUE(checker);
    EXPECT_EQ(morvik_checker_is_open(checker.get()), 0);
    EXPECT_EQ(start(checker, noisyBlock(1), 2), MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(morvik_checker_count_situations(checker.get()), MORVIK_CHECKER_REFUSED);
    const std::string refusal = "ERROR:checker:The configuration of this checker was refused, so it does not check";
    EXPECT_EQ(messagesOf(checker), (Messages{"ERROR:decoder:C_NUM_PU must be either 2, 4 or 8", refusal, refusal}));
}

TEST(Checker, PassesTheModelsWarningsOn)
{
    const Checker checker = makeChecker(2, 1);
    morvik::blocks::Block block = noisyBlock(1);
    block.sys[0] = 300;
    ASSERT_EQ(start(checker, block, 1), MORVIK_CHECKER_AGREES);
    const Messages messages = messagesOf(checker);
    ASSERT_EQ(messages.size(), 1U);
    EXPECT_TRUE(has(messages[0], "WARNING:decoder:RSC1 systematic value in position 0 saturated positively"))
        << messages[0];
}

TEST(Checker, TakesNullForOneThatIsNotOpen)
{
    morvik_checker_put(nullptr, 0, 0, 0);
    morvik_checker_forget(nullptr);
    morvik_checker_destroy(nullptr);
    EXPECT_EQ(morvik_checker_is_open(nullptr), 0);
    EXPECT_EQ(morvik_checker_start(nullptr, 1), MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(morvik_checker_observe(nullptr, 0, 0, 0, 0), MORVIK_CHECKER_REFUSED);
    EXPECT_EQ(morvik_checker_value(nullptr, 0, 0, 0), MORVIK_CHECKER_UNKNOWN);
    EXPECT_EQ(morvik_checker_ratio(nullptr, 0), MORVIK_CHECKER_UNKNOWN);
    EXPECT_EQ(morvik_checker_expected(nullptr, 0), 0);
    EXPECT_EQ(morvik_checker_standing(nullptr), MORVIK_CHECKER_REFUSED);
    EXPECT_STREQ(morvik_checker_report(nullptr), "");
    EXPECT_STREQ(morvik_checker_message(nullptr), "");
}

// A sanitizer's allocator ends the process instead; the builds with sanitizers are clang's.
#if !defined(__clang__)
/// Leaves the process a little memory during its lifetime.
class LittleMemory {
public:
    LittleMemory()
    {
        getrlimit(RLIMIT_AS, &itsLimit);
        std::ifstream file("/proc/self/statm");
        rlim_t pages = 0;
        file >> pages;
        constexpr rlim_t spare = 1U << 20U;
        const rlimit little = {pages * static_cast<rlim_t>(sysconf(_SC_PAGESIZE)) + spare, itsLimit.rlim_max};
        setrlimit(RLIMIT_AS, &little);
    }

    ~LittleMemory()
    {
        setrlimit(RLIMIT_AS, &itsLimit);
    }

    LittleMemory(const LittleMemory&) = delete;
    LittleMemory& operator=(const LittleMemory&) = delete;

private:
    rlimit itsLimit{};
};

TEST(Checker, TellsThatThereIsNoMemory)
{
    const Checker checker = makeChecker(2, 1);
    morvik::blocks::Random random(1);
    const auto block = morvik::blocks::randomBlock(random, 6144, morvik::blocks::Values::uniform);
    int answer = 0;
    {
        const LittleMemory little;
        answer = start(checker, block, 15);
    }
    EXPECT_EQ(answer, MORVIK_CHECKER_OUT_OF_MEMORY);
    EXPECT_STREQ(morvik_checker_message(checker.get()), "ERROR:checker:Out of memory");
    EXPECT_STREQ(morvik_checker_message(checker.get()), "");
    EXPECT_NE(morvik_checker_standing(checker.get()), MORVIK_CHECKER_AGREES);
    EXPECT_EQ(start(checker, block, 1), MORVIK_CHECKER_AGREES) << "with memory again";
}
#endif

TEST(Checker, KeepsABoundedNumberOfMessages)
{
    const Checker checker = makeChecker(2, 1);
    for (int time = 0; time < 5000; ++time) {
        morvik_checker_observe(checker.get(), 0, 0, 0, 0);
    }
    EXPECT_EQ(messagesOf(checker).size(), 1000U);
}

}  // namespace
}  // namespace morvik::support

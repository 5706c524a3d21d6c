// Allocation failure: every single allocation of creating a state, of decoding a block and of the conversions
// of values and texts fails in turn. Nothing crashes or leaks, the documented message or exception comes, the
// state still works, and no result is cut short.
//
// The program is linked from the model's objects, with their malloc and free wrapped by the linker.
#include <gtest/gtest.h>
#include <unistd.h>

#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <functional>
#include <iostream>
#include <map>
#include <new>
#include <sstream>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "Misc.h"
#include "morvik_v1_0_batch.h"
#include "support/FailingAllocation.h"
#include "support/FailureBlock.h"

namespace {

using Parameters = std::map<std::string, std::string>;

constexpr std::uint8_t untouched = 77;

}  // namespace

TEST(AllocationFailure, OfAStateLeavesNothingBehind)
{
    for (const int algorithm : {0, 1, 2}) {
        unsigned failures = 0;
        for (unsigned which = 1; which < manyAllocations; ++which) {
            const FailingAllocation failing(which);
            veltra_ip_morvik_v1_0_state* const state = veltra_ip_morvik_v1_0_create_state(genericsOf(algorithm));
            if (!FailingAllocation::happened()) {
                EXPECT_NE(state, nullptr);
                veltra_ip_morvik_v1_0_destroy_state(state);
                EXPECT_EQ(failing.leaked(), 0);
                break;
            }
            ++failures;
            EXPECT_EQ(state, nullptr);
            EXPECT_EQ(failing.leaked(), 0);
            EXPECT_EQ(failing.errors(),
                      which == 1 ? "ERROR:decoder:Could not allocate memory for decoder state\n"
                                 : "ERROR:decoder:Unhandled exception has occurred\n");
        }
        EXPECT_GE(failures, 7U);  // the record and six components
        EXPECT_LT(failures, manyAllocations - 1);
    }
}

TEST(AllocationFailure, OfAnEmptyRecordIsReported)
{
    const FailingAllocation failing(1);
    EXPECT_EQ(create_default_state(genericsOf(0)), nullptr);
    EXPECT_EQ(failing.errors(), "ERROR:decoder:Could not allocate memory for decoder state\n");
    EXPECT_EQ(failing.leaked(), 0);
}

/// Decodes a block in a state that has decoded another one before, with a failing allocation, then
/// without. Whether there are further allocations to fail.
bool decodeWithFailure(unsigned which, bool byComponents, unsigned traced, Block& before, Block& block)
{
    const std::vector<std::uint8_t> expected = block.bits;
    veltra_ip_morvik_v1_0_state* const state = veltra_ip_morvik_v1_0_create_state(genericsOf(1));
    EXPECT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(state, byComponents ? "component" : "generic"), 0);
    EXPECT_EQ(before.decode(state), 0);
    std::fill(block.bits.begin(), block.bits.end(), untouched);
    bool happened = false;
    {
        veltra_ip_morvik_v1_0_bitacc_dump_config(state, traced);
        const FailingAllocation failing(which);
        std::int32_t status = -1;
        std::string_view message = "ERROR:decoder:Unhandled exception has occurred\n";
        try {
            status = block.decode(state);
        } catch (const std::bad_alloc&) {
            // The soft values' buffer of the components, before the decoder is called.
            EXPECT_TRUE((byComponents || traced != 0) && which == 1) << which;
            message = "";
            status = 99;
        }
        happened = FailingAllocation::happened();
        EXPECT_EQ(status, happened ? 99 : 0) << which;
        EXPECT_EQ(failing.errors(), happened ? message : "");
    }
    if (happened) {
        EXPECT_EQ(block.outputs.dout_size, 777U);
        EXPECT_EQ(block.outputs.tag, 777U);
        EXPECT_EQ(block.bits, std::vector<std::uint8_t>(block.bits.size(), untouched));
    }
    veltra_ip_morvik_v1_0_bitacc_dump_config(state, 0);
    EXPECT_EQ(block.decode(state), 0);
    EXPECT_EQ(block.bits, expected);
    veltra_ip_morvik_v1_0_destroy_state(state);
    return happened;
}

/// Lets every allocation of a decode fail in turn; how many there are.
unsigned failuresOfADecode(bool byComponents, unsigned traced, unsigned previous, unsigned K)
{
    Block before(previous);
    Block block(K);
    veltra_ip_morvik_v1_0_state* const state = veltra_ip_morvik_v1_0_create_state(genericsOf(1));
    EXPECT_EQ(block.decode(state), 0);
    veltra_ip_morvik_v1_0_destroy_state(state);
    unsigned which = 1;
    while (which < manyAllocations && decodeWithFailure(which, byComponents, traced, before, block)) {
        ++which;
    }
    EXPECT_LT(which, manyAllocations);
    return which - 1;
}

TEST(AllocationFailure, OfADecodeLeavesAWorkingState)
{
    for (const bool byComponents : {false, true}) {
        for (const auto& [previous, K] :
             std::vector<std::pair<unsigned, unsigned>>{{40, 128}, {128, 40}, {128, 128}, {256, 512}}) {
            for (const unsigned traced : {0U, 1U}) {
                SCOPED_TRACE(std::string(byComponents ? "components" : "lanes") + ", traced " + std::to_string(traced) +
                             ", " + std::to_string(previous) + " " + std::to_string(K));
                const long live = blocksInUse();
                // The lanes keep all memory for the next block.
                const unsigned least = !byComponents && traced == 0 && K == previous ? 0 : 2;
                EXPECT_GE(failuresOfADecode(byComponents, traced, previous, K), least);
                EXPECT_EQ(blocksInUse(), live);
            }
        }
    }
}

/// Lets every allocation of a call fail in turn: it must throw each time, and give what is expected when none is
/// left to fail. How many there are.
template <class Result>
unsigned everyAllocationFails(const std::function<Result()>& call, const Result& expected)
{
    for (unsigned which = 1; which < manyAllocations; ++which) {
        bool thrown = false;
        bool happened = false;
        bool asExpected = false;
        long leaked = 0;
        {
            const FailingAllocation failing(which);
            try {
                asExpected = call() == expected;
            } catch (const std::bad_alloc&) {
                thrown = true;
            }
            happened = FailingAllocation::happened();
            leaked = failing.leaked();
        }
        EXPECT_EQ(leaked, 0) << which;
        EXPECT_EQ(thrown, happened) << which;
        if (!happened) {
            EXPECT_TRUE(asExpected);
            return which - 1;
        }
    }
    return manyAllocations;
}

TEST(AllocationFailure, NeverShortensAText)
{
    const struct {
        std::function<std::string()> call;
        std::string expected;
        unsigned allocations;  // at least; a text of up to 15 characters needs none
    } cases[] = {
        {[] { return toSIString(1500.0); }, "1.50 k", 0},
        {[] { return toSIString(-1500.0L, 30); }, "-1.500000000000000000000000000000 k", 2},
        {[] { return toSIString(std::uint64_t{2}, 600); }, "2." + std::string(600, '0') + " ", 3},
        {[] { return toSIString(std::uint32_t{2}, 20000); }, "2." + std::string(20000, '0') + " ", 4},
        {[] { return timeToString(59U); }, "59s", 0},
        {[] { return timeToString(90.0); }, "1.5min", 0},
        {[] { return timeToString(86400L); }, "24hr", 0},
        {[] { return timeToString(345600U); }, "1.33333days", 0},
    };
    for (const auto& [call, expected, allocations] : cases) {
        SCOPED_TRACE(expected.substr(0, 40));
        const unsigned failures = everyAllocationFails(call, expected);
        EXPECT_GE(failures, allocations);
        EXPECT_LT(failures, 100U);
    }
}

TEST(AllocationFailure, NeverShortensANumber)
{
    using Call = std::function<std::int32_t()>;
    const std::string long40 = "1" + std::string(39, '0');
    const std::pair<Call, std::int32_t> calls[] = {
        {[] { return stringToTime("90"); }, 90},
        {[] { return stringToTime("                    1.5 minutes"); }, 90},
        {[&] { return stringToTime(long40 + "e-39h"); }, 3600},
    };
    for (const auto& [call, expected] : calls) {
        SCOPED_TRACE(expected);
        const unsigned failures = everyAllocationFails(call, expected);
        EXPECT_GE(failures, 1U);
        EXPECT_LT(failures, 100U);
    }
}

const std::string longValue(600, 'x');
const std::string parameterLines = "a = 1\nb = " + longValue + "\nc = 3\n";
const Parameters readParameters{{"a", "1"}, {"b", longValue}, {"c", "3"}};

TEST(AllocationFailure, NeverShortensAParameterFile)
{
    const std::string name = testing::TempDir() + "morvik_allocation_" + std::to_string(getpid());
    std::ofstream(name) << parameterLines;
    const std::function<Parameters()> call = [&name] {
        Parameters parameters;
        EXPECT_TRUE(parse(name, parameters, false));
        return parameters;
    };
    const unsigned failures = everyAllocationFails(call, readParameters);
    EXPECT_GE(failures, 6U);  // the file's buffer, three entries, the long line and value
    EXPECT_LT(failures, 100U);
    std::remove(name.c_str());
}

TEST(AllocationFailure, OfALineIsAFailureOfItsStream)
{
    unsigned which = 1;
    for (bool happened = true; happened && which < 100; ++which) {
        std::istringstream stream(parameterLines);
        Parameters parameters;
        bool complete = true;
        {
            const FailingAllocation failing(which);
            try {
                parse(stream, parameters, false);
                complete = !stream.bad();
            } catch (const std::bad_alloc&) {
                complete = false;
            }
            happened = FailingAllocation::happened();
        }
        EXPECT_EQ(complete, !happened) << which;
        EXPECT_EQ(parameters == readParameters, complete) << which;
    }
    EXPECT_GT(which, 6U);
    EXPECT_LT(which, 100U);
}

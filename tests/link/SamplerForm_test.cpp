// SamplerForm: tests of every way to draw values against the definition.
#include "link/random/SamplerForm.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <random>
#include <string>

#include "link/channel/Channel.h"

#include "support/SamplerForms.h"

namespace morvik::link {
namespace {

constexpr std::int8_t guard = 0x55;

/// A group with room for its values and what lies around them.
struct GuardedGroup {
    std::array<std::int8_t, 192> values;
    ValueGroup group{};

    GuardedGroup(std::uint64_t counterLow, std::uint64_t counterHigh, std::uint64_t bits, unsigned count)
    {
        values.fill(guard);
        constexpr std::uint64_t stale = 0xAAAAAAAAAAAAAAAA;
        group = {counterLow, counterHigh, bits, nullptr, nullptr, count, stale, stale};
    }
};

/// What a group has to be like, value by value.
void expectDefinition(const AliasTable& table, const RandomKey& key, const GuardedGroup& drawn)
{
    const ValueGroup& group = drawn.group;
    std::array<std::int8_t, 192> values;
    values.fill(guard);
    std::uint64_t undecided = 0;
    std::uint64_t ends = 0;
    for (unsigned i = 0; i < group.count; ++i) {
        const RandomBlock random = randomBlock(key, group.counterLow + i / 8, group.counterHigh);
        const auto byte = [&random](unsigned n) {
            return random[n / 4] >> 8 * (n % 4) & 0xFF;
        };
        const unsigned entry = byte(i % 8);
        const unsigned fraction = byte(8 + i % 8);
        const auto value = static_cast<std::int8_t>(fraction > table.highThreshold[entry] ? table.alias[entry] : entry);
        const std::uint64_t place = std::uint64_t{1} << i;
        values[64 + i] = static_cast<std::int8_t>((group.bits & place) != 0 ? value : -value);
        undecided |= fraction == table.highThreshold[entry] ? place : 0;
        ends |= value == -128 || value == 127 ? place : 0;
    }
    EXPECT_EQ(drawn.values, values);
    EXPECT_EQ(group.undecided, undecided);
    EXPECT_EQ(group.ends, ends);
}

/// Tables of few and of many values, of small and of large probabilities.
std::vector<AliasTable> tables()
{
    std::vector<AliasTable> made;
    for (const double scale : {0.3, 8.0, 30.0, 127.0, 1000.0}) {
        made.emplace_back(roundedDistribution(0.9, scale).weights);
    }
    AliasTable::Weights equal;
    equal.fill(std::uint64_t{1} << 40);
    made.emplace_back(equal);
    return made;
}

class EverySamplerForm : public testing::TestWithParam<SamplerForm> {};

}  // namespace

TEST_P(EverySamplerForm, DrawsWhatTheDefinitionSays)
{
    const SamplerForm form = GetParam();
    std::mt19937_64 random(1);
    std::uint64_t undecided = 0;
    std::uint64_t ends = 0;
    for (const AliasTable& table : tables()) {
        const RandomKey key = randomKey(random());
        std::vector<GuardedGroup> drawn;
        for (unsigned round = 0; round < 3; ++round) {
            for (unsigned count = 1; count <= 64; ++count) {
                drawn.emplace_back(random(), random(), random(), count);
            }
        }
        for (unsigned i = 0; i < 500; ++i) {
            drawn.emplace_back(random(), random(), random(), 64);
        }
        std::vector<ValueGroup> groups;
        for (GuardedGroup& each : drawn) {
            each.group.values = &each.values[64];
            groups.push_back(each.group);
        }
        form.draw(table, key, groups.data(), groups.size());
        for (std::size_t g = 0; g < drawn.size(); ++g) {
            drawn[g].group = groups[g];
            expectDefinition(table, key, drawn[g]);
            undecided |= groups[g].undecided;
            ends |= groups[g].ends;
        }
    }
    EXPECT_EQ(undecided, ~std::uint64_t{0}) << "every place has been undecided once";
    EXPECT_EQ(ends, ~std::uint64_t{0}) << "every place has been at an end once";
}

TEST_P(EverySamplerForm, DrawsAnyNumberOfGroups)
{
    const SamplerForm form = GetParam();
    const AliasTable table(roundedDistribution(0.9, 8).weights);
    const RandomKey key = randomKey(5);
    for (std::size_t count = 0; count < 12; ++count) {
        std::vector<GuardedGroup> drawn;
        std::vector<ValueGroup> groups;
        for (std::size_t g = 0; g < 12; ++g) {
            drawn.emplace_back(8 * g, 1, 0x0123456789ABCDEF, 44);
        }
        for (GuardedGroup& each : drawn) {
            each.group.values = &each.values[64];
            groups.push_back(each.group);
        }
        form.draw(table, key, groups.data(), count);
        for (std::size_t g = 0; g < 12; ++g) {
            drawn[g].group = groups[g];
            if (g < count) {
                expectDefinition(table, key, drawn[g]);
            } else {
                EXPECT_EQ(groups[g].ends, 0xAAAAAAAAAAAAAAAA) << count << ' ' << g;
                EXPECT_EQ(drawn[g].values[64], guard) << count << ' ' << g;
            }
        }
    }
}

TEST_P(EverySamplerForm, DrawsTheNoiseOfTheDefinition)
{
    const SamplerForm form = GetParam();
    std::mt19937_64 random(2);
    std::uint64_t undecidedAtAll = 0;
    for (const AliasTable& table : tables()) {
        const RandomKey key = randomKey(random());
        for (const std::size_t groups : {0U, 1U, 2U, 3U, 4U, 900U}) {
            const NoiseCounters counters = {random(), random(), random()};
            std::vector<std::int16_t> numbers(64 * groups + 64, guard);
            std::vector<std::int8_t> steps(64 * groups + 64, guard);
            std::vector<std::uint64_t> undecided(groups + 1, guard);
            form.noise(table, key, counters, groups, {numbers.data(), steps.data(), undecided.data()});
            for (std::size_t i = 0; i < 64 * groups; ++i) {
                const RandomBlock coarse = randomBlock(key, counters.coarseLow + i / 8, counters.high);
                const RandomBlock fine = randomBlock(key, counters.fineLow + i / 8, counters.high);
                const auto byte = [i](const RandomBlock& block, unsigned half) {
                    return block[2 * half + i % 8 / 4] >> 8 * (i % 4) & 0xFF;
                };
                const unsigned entry = byte(coarse, 0);
                const unsigned threshold = table.highThreshold[entry];
                const auto step = static_cast<std::int8_t>(byte(coarse, 1) > threshold ? table.alias[entry] : entry);
                ASSERT_EQ(steps[i], step) << i;
                ASSERT_EQ(undecided[i / 64] >> i % 64 & 1, byte(coarse, 1) == threshold ? 1U : 0U) << i;
                const int number = 256 * step + static_cast<int>(byte(fine, 0) + byte(fine, 1)) - 255;
                ASSERT_EQ(numbers[i], static_cast<std::int16_t>(number)) << i;
            }
            for (std::size_t g = 0; g < groups; ++g) {
                undecidedAtAll |= undecided[g];
            }
            EXPECT_TRUE(
                std::all_of(&numbers[64 * groups], &numbers[64 * groups] + 64, [](int n) { return n == guard; }));
            EXPECT_TRUE(std::all_of(&steps[64 * groups], &steps[64 * groups] + 64, [](int n) { return n == guard; }));
            EXPECT_EQ(undecided[groups], std::uint64_t{guard});
        }
    }
    EXPECT_EQ(undecidedAtAll, ~std::uint64_t{0}) << "every place has been undecided once";
}

INSTANTIATE_TEST_SUITE_P(Forms, EverySamplerForm, everySamplerForm(), samplerFormName);

TEST(SamplerForm, TheMachinesFormsAreNamedAndEndWithTheGenericOne)
{
    std::vector<std::string> names;
    for (const SamplerForm& form : samplerForms()) {
        names.emplace_back(form.name);
    }
    EXPECT_EQ(names.back(), "generic");
    std::sort(names.begin(), names.end());
    EXPECT_EQ(std::unique(names.begin(), names.end()), names.end());
#if defined(__x86_64__) || defined(__i386__)
    std::size_t expected = 1;
    if (__builtin_cpu_supports("avx2")) {
        ++expected;
        if (__builtin_cpu_supports("avx512bw") && __builtin_cpu_supports("avx512vbmi")) {
            ++expected;
        }
    }
    EXPECT_EQ(names.size(), expected);
#endif
}

}  // namespace morvik::link

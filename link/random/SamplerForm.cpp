// SamplerForm: the implementations of drawing quantised values, one for each instruction set that has its own.
#include "SamplerForm.h"

#include <algorithm>
#include <array>
#include <cstring>

#include "SamplerFormX86.h"

namespace morvik::link {

namespace {

/// The mask bits of eight values of a group.
struct Left8 {
    unsigned undecided = 0;
    unsigned ends = 0;
};

/// Draws the eight values of a random block; defines what the other forms must give.
Left8 drawBlock(const AliasTable& table, const RandomBlock& random, unsigned bits, std::int8_t* values)
{
    Left8 left;
    for (unsigned i = 0; i < 8; ++i) {
        const unsigned entry = random[i / 4] >> 8 * (i % 4) & 0xFF;
        const unsigned fraction = random[2 + i / 4] >> 8 * (i % 4) & 0xFF;
        const unsigned threshold = table.highThreshold[entry];
        const unsigned value = fraction <= threshold ? entry : table.alias[entry];
        left.undecided |= (fraction == threshold ? 1U : 0U) << i;
        left.ends |= (value == 127 || value == 128 ? 1U : 0U) << i;
        values[i] = static_cast<std::int8_t>((bits >> i & 1) != 0 ? value : 0 - value);
    }
    return left;
}

void drawGroup(const AliasTable& table, const RandomKey& key, ValueGroup& group)
{
    group.undecided = 0;
    group.ends = 0;
    for (unsigned i = 0; i < group.count; i += 8) {
        std::array<std::int8_t, 8> values;
        const RandomBlock random = randomBlock(key, group.counterLow + i / 8, group.counterHigh);
        const Left8 left = drawBlock(table, random, group.bits >> i & 0xFF, values.data());
        const unsigned used = std::min(8U, group.count - i);
        std::memcpy(group.values + i, values.data(), used);
        group.undecided |= std::uint64_t{left.undecided & ((1U << used) - 1)} << i;
        group.ends |= std::uint64_t{left.ends & ((1U << used) - 1)} << i;
    }
}

void drawGeneric(const AliasTable& table, const RandomKey& key, ValueGroup* groups, std::size_t count)
{
    for (std::size_t g = 0; g < count; ++g) {
        drawGroup(table, key, groups[g]);
    }
}

void randomBlocksGeneric(const RandomKey& key, std::uint64_t* low, std::uint64_t* high, std::size_t count)
{
    for (std::size_t i = 0; i < count; ++i) {
        const RandomBlock block = randomBlock(key, low[i], high[i]);
        low[i] = std::uint64_t{block[1]} << 32 | block[0];
        high[i] = std::uint64_t{block[3]} << 32 | block[2];
    }
}

void noiseGeneric(const AliasTable& table,
                  const RandomKey& key,
                  const NoiseCounters& counters,
                  std::size_t groups,
                  const DrawnNoise& drawn)
{
    constexpr unsigned allBits = 0xFF;
    std::fill_n(drawn.undecided, groups, 0);
    for (std::size_t b = 0; b < 8 * groups; ++b) {
        std::int8_t* const levels = drawn.levels + 8 * b;
        const Left8 left = drawBlock(table, randomBlock(key, counters.coarseLow + b, counters.high), allBits, levels);
        drawn.undecided[b / 8] |= std::uint64_t{left.undecided} << 8 * (b % 8);
        const RandomBlock fine = randomBlock(key, counters.fineLow + b, counters.high);
        for (unsigned i = 0; i < 8; ++i) {
            const auto u = static_cast<int>(fine[i / 4] >> 8 * (i % 4) & 0xFF);
            const auto v = static_cast<int>(fine[2 + i / 4] >> 8 * (i % 4) & 0xFF);
            drawn.numbers[8 * b + i] = static_cast<std::int16_t>(256 * levels[i] + u + v - 255);
        }
    }
}

}  // namespace

std::vector<SamplerForm> samplerForms()
{
    std::vector<SamplerForm> forms;
#if defined(MORVIK_LINK_X86)
    __builtin_cpu_init();
    if (__builtin_cpu_supports("avx512f") && __builtin_cpu_supports("avx512bw") &&
        __builtin_cpu_supports("avx512vbmi")) {
        forms.push_back({"avx512", drawAvx512, randomBlocksAvx512, noiseAvx512});
    }
    if (__builtin_cpu_supports("avx2")) {
        forms.push_back({"avx2", drawAvx2, randomBlocksAvx2, noiseAvx2});
    }
#endif
    forms.push_back({"generic", drawGeneric, randomBlocksGeneric, noiseGeneric});
    return forms;
}

}  // namespace morvik::link

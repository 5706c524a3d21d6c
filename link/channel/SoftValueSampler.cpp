// SoftValueSampler: draws the soft values of transmitted bits directly from their distribution.
//
// A form draws every value from 16 random bits. The rest take a random block each: if the 8 bits equal the threshold's,
// its word 0 decides; at the ends of the range, its word 1 tells how far beyond.
#include "SoftValueSampler.h"

#include <algorithm>

namespace morvik::link {

namespace {

/// Converts between the values of a 1 and of a 0, as bytes.
std::uint8_t turned(int value, bool bit)
{
    return static_cast<std::uint8_t>(bit ? value : -value);
}

}  // namespace

SoftValueSampler::SoftValueSampler(const RoundedDistribution& distribution,
                                   const RandomKey& key,
                                   const SamplerForm& form)
    : itsTable(distribution.weights),
      itsDistribution(distribution),
      itsKey(key),
      itsForm(form),
      itsRefinements(key, form)
{
}

void SoftValueSampler::put(const FrameRandom& random,
                           std::uint32_t number,
                           const std::uint64_t* bits,
                           unsigned count,
                           std::int8_t* values,
                           std::uint32_t& clipped)
{
    const std::size_t groups = itsGroupCount + (count + 63) / 64;
    if (groups > itsGroups.size()) {
        itsGroups.resize(2 * groups);
    }
    for (unsigned first = 0; first < count; first += 64) {
        ValueGroup& group = itsGroups[itsGroupCount++];
        group.counterLow = random.counterLow(random_index::softValues + (number + first) / 8);
        group.counterHigh = random.counterHigh();
        group.bits = bits[first / 64];
        group.values = values + first;
        group.count = std::min(64U, count - first);
        group.clipped = &clipped;
    }
}

void SoftValueSampler::draw()
{
    itsForm.draw(itsTable, itsKey, itsGroups.data(), itsGroupCount);
    collect(&ValueGroup::undecided);
    for (std::size_t i = 0; i < itsOpen.size(); ++i) {
        decide(itsOpen[i], static_cast<std::uint32_t>(itsRefinements.low(i) & 0xFFFFFFFF));
    }
    collect(&ValueGroup::ends);
    for (std::size_t i = 0; i < itsOpen.size(); ++i) {
        divideEnd(itsOpen[i], static_cast<std::uint32_t>(itsRefinements.low(i) >> 32));
    }
    itsGroupCount = 0;
}

/// Collects the marked values as open ones, and draws their random blocks.
void SoftValueSampler::collect(std::uint64_t ValueGroup::*marks)
{
    itsOpen.clear();
    for (std::size_t g = 0; g < itsGroupCount; ++g) {
        for (std::uint64_t left = itsGroups[g].*marks; left != 0; left &= left - 1) {
            itsOpen.push_back(static_cast<OpenValue>(64 * g) + static_cast<unsigned>(__builtin_ctzll(left)));
        }
    }
    itsRefinements.clear();
    for (const OpenValue open : itsOpen) {
        const ValueGroup& group = itsGroups[open / 64];
        const std::uint64_t firstValue = 8 * ((group.counterLow & 0xFFFFFFFF) - random_index::softValues);
        const std::uint64_t index = random_index::refinements + firstValue + open % 64;
        itsRefinements.put(group.counterLow >> 32 << 32 | index, group.counterHigh);
    }
    itsRefinements.draw();
}

/// Decides a value whose 8 bits equal the threshold's.
void SoftValueSampler::decide(OpenValue open, std::uint32_t random)
{
    ValueGroup& group = itsGroups[open / 64];
    const unsigned i = open % 64;
    const std::uint64_t place = std::uint64_t{1} << i;
    const bool bit = (group.bits & place) != 0;
    const std::uint8_t entry = turned(group.values[i], bit);
    const std::uint8_t value = random < itsTable.lowThreshold[entry] ? entry : itsTable.alias[entry];
    group.values[i] = static_cast<std::int8_t>(turned(value, bit));
    group.ends = (group.ends & ~place) | (value == 127 || value == 128 ? place : 0);
}

/// Decides a value at one end of the range.
void SoftValueSampler::divideEnd(OpenValue open, std::uint32_t random)
{
    const ValueGroup& group = itsGroups[open / 64];
    const unsigned i = open % 64;
    const bool bit = (group.bits >> i & 1) != 0;
    int rounded = 0;
    if (turned(group.values[i], bit) == 127) {
        rounded = random < itsDistribution.top[0] ? 127 : random < itsDistribution.top[1] ? 128 : 129;
    } else {
        rounded = random < itsDistribution.bottom ? -128 : -129;
    }
    const SoftValue soft = SoftValue::of(bit ? rounded : -rounded);
    group.values[i] = soft.value;
    *group.clipped += soft.clipped ? 1 : 0;
}

}  // namespace morvik::link

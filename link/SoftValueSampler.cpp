// SoftValueSampler: draws the soft values of sent bits straight from their distribution.
//
// A form draws all of them as 16 random bits can tell. What is left takes a value's own random block: where the 8 bits
// equal the threshold's, its word 0 goes on; at the ends of the range, its word 1 tells how far beyond.
#include "SoftValueSampler.h"

#include <cstddef>

namespace morvik::link {

namespace {

/// Calls `visit` with the number of each bit that is set, 64 bits to a word.
template <class Visit>
void forEachBit(const std::vector<std::uint64_t>& words, Visit visit)
{
    for (std::size_t w = 0; w < words.size(); ++w) {
        for (std::uint64_t left = words[w]; left != 0; left &= left - 1) {
            visit(static_cast<unsigned>(64 * w) + static_cast<unsigned>(__builtin_ctzll(left)));
        }
    }
}

bool bitOf(const std::uint64_t* words, unsigned i)
{
    return (words[i / 64] >> i % 64 & 1) != 0;
}

}  // namespace

SoftValueSampler::SoftValueSampler(const RoundedDistribution& distribution, const SamplerForm& form)
    : itsTable(distribution.weights), itsDistribution(distribution), itsForm(form)
{
}

std::uint32_t SoftValueSampler::draw(
    const FrameKey& frame, std::uint32_t first, const std::uint64_t* bits, unsigned count, std::int8_t* values)
{
    itsUndecided.resize((count + 63) / 64);
    itsEnds.resize(itsUndecided.size());
    itsForm.draw({&itsTable,
                  &frame,
                  random_index::softValues + first / 8,
                  count,
                  bits,
                  values,
                  itsUndecided.data(),
                  itsEnds.data()});

    const auto refinement = [&](unsigned i) {
        return randomBlock(frame, random_index::refinements + first + i);
    };
    const auto signedAs = [&](unsigned i, int value) {
        return static_cast<std::uint8_t>(bitOf(bits, i) ? value : -value);
    };
    forEachBit(itsUndecided, [&](unsigned i) {
        const std::uint8_t entry = signedAs(i, values[i]);
        const bool own = refinement(i)[0] < itsTable.lowThreshold[entry];
        const std::uint8_t value = own ? entry : itsTable.alias[entry];
        values[i] = static_cast<std::int8_t>(signedAs(i, value));
        const std::uint64_t place = std::uint64_t{1} << i % 64;
        const bool end = value == 127 || value == 128;
        itsEnds[i / 64] = (itsEnds[i / 64] & ~place) | (end ? place : 0);
    });
    std::uint32_t clipped = 0;
    forEachBit(itsEnds, [&](unsigned i) {
        const SoftValue soft = atEnd(signedAs(i, values[i]) == 127, bitOf(bits, i), refinement(i)[1]);
        values[i] = soft.value;
        clipped += soft.clipped ? 1 : 0;
    });
    return clipped;
}

/// One of the range's ends, as the random number divides it up.
SoftValue SoftValueSampler::atEnd(bool top, bool bit, std::uint32_t random) const
{
    int rounded = 0;
    if (top) {
        rounded = random < itsDistribution.top[0] ? 127 : random < itsDistribution.top[1] ? 128 : 129;
    } else {
        rounded = random < itsDistribution.bottom ? -128 : -129;
    }
    return SoftValue::of(bit ? rounded : -rounded);
}

}  // namespace morvik::link

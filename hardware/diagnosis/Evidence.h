// Evidence: how well soft values agree with the code word of the bits that were sent, for all mistakes at a time.
//
// The bits are encoded once more, and the signs of the soft values compared with what they should be. Noise turns a
// part of them around, some 20 % where a block just decodes; a mistake makes half of those wrong that it touches. So
// mistakes can be told apart with fewer blocks than decoding takes, and where noise is too strong for it.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_EVIDENCE_H
#define MORVIK_HARDWARE_DIAGNOSIS_EVIDENCE_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <vector>

#include "Mistakes.h"

namespace morvik::diagnosis {

/// Signs that contradict the bits; a value of 0 is half a contradiction.
struct Signs {
    double wrong = 0;
    double all = 0;

    double fraction() const
    {
        return all > 0 ? wrong / all : 0;
    }

    /// How many standard deviations fewer are wrong than chance makes them.
    double certainty() const;

    /// The logarithm of the odds that they belong to the bits, against chance, where each is wrong with `probability`.
    double odds(double probability) const;

    /// The same for the probability that fits best.
    double odds() const;
};

/// Mistakes, and what is wrong with the signs once they are undone.
struct Suspicion {
    Mistakes mistakes;
    Signs signs;
};

/// All combinations of mistakes but scale and smaller sizes. The blocks' bits have to be block sizes, and none may have
/// fewer rows than bits.
std::vector<Suspicion> suspicions(const std::vector<Case>& cases);

/// The same for all block sizes that are smaller than that of the blocks, all of one size; without mistakes of order.
std::vector<Suspicion> suspicionsOfSmallerSizes(const std::vector<Case>& cases);

/// What soft values look like beside their code word.
struct Appearance {
    std::array<Signs, 3> streams;  ///< of the data: systematic, first parity, second parity
    Signs tail;
    double amplitude = 0;  ///< mean of the values, those of bits 0 being negated
    double power = 0;      ///< mean of their squares

    Signs all() const;

    /// Of all streams but one, without the tail.
    Signs others(std::size_t stream) const;
};

/// Of cases that are as they should be, but for the scale.
Appearance appearanceOf(const std::vector<Case>& cases);

/// The streams of a block's code word, tail included.
std::array<std::vector<std::uint8_t>, 3> encoded(const std::vector<std::uint8_t>& bits);

}  // namespace morvik::diagnosis

#endif

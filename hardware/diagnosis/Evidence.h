// Evidence: how well soft values agree with the code word of the bits sent, for all mistakes at once.
//
// The bits are encoded again, and the signs of the soft values compared with the expected ones. Noise flips some of
// them, about 20 % where a block just decodes; a mistake makes half of the signs that it touches wrong. So mistakes can
// be told apart with fewer blocks than decoding takes, and in noise too strong for it.
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

    /// By how many standard deviations the number of wrong signs is below chance.
    double certainty() const;

    /// The log odds that the signs belong to the bits, against chance, if each is wrong with `probability`.
    double odds(double probability) const;

    /// The same for the probability that fits best.
    double odds() const;
};

/// Log odds that a mistake needs: by itself (e^-12 is a chance in 160 000 for each of some thousand combinations), and
/// together with blocks that decode once it is undone.
constexpr double enoughByItself = 12;
constexpr double enoughWithDecoding = 6;
/// Standard deviations by which signs must beat chance to be related to the bits.
constexpr double related = 5;

/// The log odds that one more wrong sign is chance, next to a suspicion that explains the most signs.
double weightOf(const Signs& fewest);

/// Mistakes, and the signs once they are undone.
struct Suspicion {
    Mistakes mistakes;
    Signs signs;
};

/// All combinations of mistakes but scale and smaller sizes. Numbers of bits must be block sizes, and no block may have
/// fewer rows than bits.
std::vector<Suspicion> suspicions(const std::vector<Case>& cases);

/// The same for all block sizes smaller than the blocks', without mistakes of order. All blocks must have one size.
std::vector<Suspicion> suspicionsOfSmallerSizes(const std::vector<Case>& cases);

/// Statistics of soft values against their code word.
struct Appearance {
    std::array<Signs, 3> streams;  ///< of the data: systematic, first parity, second parity
    Signs tail;
    double amplitude = 0;  ///< mean of the values, negated for bits 0
    double power = 0;      ///< mean of their squares

    Signs all() const;

    /// Of all streams but one, without the tail.
    Signs others(std::size_t stream) const;
};

/// The appearance of cases that are right but for the scale.
Appearance appearanceOf(const std::vector<Case>& cases);

/// The streams of a block's code word, tail included.
std::array<std::vector<std::uint8_t>, 3> encoded(const std::vector<std::uint8_t>& bits);

}  // namespace morvik::diagnosis

#endif

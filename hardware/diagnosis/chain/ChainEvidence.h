// ChainEvidence: how well soft values of transport blocks agree with their coded bits, for many mistakes.
//
// As Evidence.h does for code blocks: signs are compared with those that the bits should have, so that mistakes can be
// told apart without decoding.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINEVIDENCE_H
#define MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINEVIDENCE_H

#include <array>
#include <cstdint>
#include <vector>

#include "ChainMistakes.h"
#include "hardware/diagnosis/Evidence.h"

namespace morvik::diagnosis {

/// The transmissions of a transport block.
struct ChainCase {
    std::vector<std::vector<float>> rows;  ///< up to one for each redundancy version, G values each
    std::vector<std::uint8_t> sent;        ///< A bits, each 0 or 1; empty if they are not known
};

/// Log odds by which explanations differ that can be told apart.
constexpr double tellingApart = 3;
/// The same of a soft buffer's size, whose best is one of thousands.
constexpr double moreForBuffer = 8;

/// Mistakes, and the signs once they are undone.
struct ChainSuspicion {
    ChainMistakes mistakes;
    Signs signs;
};

class ChainEvidence {
public:
    /// Of the cases, those whose bits are known count, the first of them up to some hundred thousand values.
    ChainEvidence(const ChainFormat& format, const std::vector<ChainCase>& cases);

    /// All mistakes but those of soft buffer and scale: each by itself, and each two of different kinds, with the
    /// redundancy versions that fit best.
    std::vector<ChainSuspicion> suspicions() const;

    /// No mistake at all.
    ChainSuspicion asTold() const;

    /// The suspicion with the soft buffer that fits best.
    ChainSuspicion withBuffer(const ChainSuspicion& suspicion) const;

private:
    using Row = std::vector<std::int8_t>;                                       // signs: 1, 0 or -1
    using Sums = std::vector<std::array<long long, link::redundancyVersions>>;  // of each transmission

    struct Known {
        std::vector<Row> rows;
        std::vector<Row> codeWords;  // of each code block: its streams, one after the other
    };

    struct Tally {
        ChainMistakes mistakes;
        Sums sums;
    };

    Tally tallied(const ChainMistakes& mistakes) const;
    ChainSuspicion judged(const Tally& tally, double weight) const;
    Signs signsOf(long long sum) const;
    BufferSize bestBuffer(const ChainSuspicion& suspicion) const;

    ChainFormat itsFormat;
    link::TransportBlockCode itsCode;
    std::vector<Known> itsKnown;
    double itsAll = 0;  // values
};

/// What the values say of their scale.
struct Strength {
    double meanAmplitude = 0;
    double unit = 0;      ///< the value that says a log-likelihood ratio of 1; 0: too few signs are wrong to tell
    double wrong = 0;     ///< fraction of signs that are wrong,
    double promised = 0;  ///< and what the ratios promise, which is as many in any noise
};

/// A received value, negated where its bit is 0, and which bit that is.
struct AgreeingValue {
    float value;
    unsigned stream;  ///< 0 to 2, or 3 for the tail
    unsigned transmission;
    unsigned codeBlock;
    unsigned symbolBit;  ///< its place in the symbol, 0 to 7
    unsigned eighth;     ///< of the code block's values in the transmission, 0 to 7
};

/// The received values with the mistakes undone.
std::vector<AgreeingValue> agreeingValues(const ChainFormat& format,
                                          const std::vector<ChainCase>& cases,
                                          const ChainMistakes& mistakes);

/// The strength of such values.
Strength strengthOf(const std::vector<AgreeingValue>& values);

}  // namespace morvik::diagnosis

#endif

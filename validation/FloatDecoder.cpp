// FloatDecoder: the floating-point reference: max-log-MAP over whole blocks, with extrinsic values times 0.75.
#include "FloatDecoder.h"

#include <algorithm>
#include <cstdint>
#include <stdexcept>
#include <string>

#include "rules/BlockSizes.h"
#include "rules/Tail.h"

namespace morvik::validation {

namespace {

using Values = FloatDecoder::Values;

constexpr float extrinsicScale = 0.75F;
constexpr float unreached = -1e9F;  // the metric of a state that no path reaches: below any other

/// A transition of the constituent encoder of TS 36.212, clause 5.1.3.2.1: g0 = 1 + D^2 + D^3, g1 = 1 + D + D^3.
struct Transition {
    std::size_t next;
    bool parity;
};

/// Bit 2 of a state is the register that is fed, bit 0 the last one.
constexpr Transition transition(std::size_t state, bool bit)
{
    const bool first = (state & 4) != 0;
    const bool second = (state & 2) != 0;
    const bool third = (state & 1) != 0;
    const bool fed = (bit != second) != third;
    return {(fed ? 4U : 0U) | state >> 1, (fed != first) != third};
}

/// The systematic bit of the tail, which feeds a 0 to the registers.
constexpr bool terminatingBit(std::size_t state)
{
    return ((state & 2) != 0) != ((state & 1) != 0);
}

/// The metric of a branch, without a term that all branches of its step share.
Values branch(bool bit, bool parity, const Values& systematicValue, const Values& parityValue)
{
    return (bit ? systematicValue : Values{}) + (parity ? parityValue : Values{});
}

Values larger(const Values& one, const Values& other)
{
    return one > other ? one : other;
}

}  // namespace

FloatDecoder::FloatDecoder(unsigned K)
    : itsK(K), itsPermutation(K), itsForward(K), itsInput(K), itsTotal(K), itsExtrinsic(K), itsRatios(K)
{
    const rules::BlockSize* const row = rules::findBlockSize(K);
    if (row == nullptr) {
        throw std::invalid_argument("a block size of " + std::to_string(K));
    }
    for (std::size_t k = 0; k < K; ++k) {
        const std::uint64_t i = k;
        itsPermutation[k] = static_cast<std::size_t>((row->f1 * i + row->f2 * i * i) % K);
    }
}

const FloatDecoder::Stream& FloatDecoder::decode(const Received& received, unsigned iterations)
{
    takeIn(received);
    itsApriori.assign(itsK, Values{});
    for (unsigned i = 0; i < iterations; ++i) {
        pass(itsConstituents[0]);
        for (std::size_t k = 0; k < itsK; ++k) {
            itsApriori[k] = itsExtrinsic[itsPermutation[k]];
        }
        pass(itsConstituents[1]);
        for (std::size_t k = 0; k < itsK; ++k) {
            itsApriori[itsPermutation[k]] = itsExtrinsic[k];
            itsRatios[itsPermutation[k]] = itsTotal[k];
        }
    }
    return itsRatios;
}

void FloatDecoder::takeIn(const Received& received)
{
    for (unsigned c = 0; c < 2; ++c) {
        Constituent& of = itsConstituents[c];
        of.systematic.resize(itsK + rules::tailSteps);
        of.parity = received[c + 1];
        of.parity.resize(itsK + rules::tailSteps);
        for (std::size_t k = 0; k < itsK; ++k) {
            of.systematic[k] = received[0][c == 0 ? k : itsPermutation[k]];
        }
        for (unsigned step = 0; step < rules::tailSteps; ++step) {
            const auto tailValue = [&](bool isParity) {
                const unsigned place = rules::tailPlace(c, step, isParity);
                return received[place % 3][itsK + place / 3];
            };
            of.systematic[itsK + step] = tailValue(false);
            of.parity[itsK + step] = tailValue(true);
        }
    }
}

void FloatDecoder::pass(const Constituent& received)
{
    for (std::size_t k = 0; k < itsK; ++k) {
        itsInput[k] = received.systematic[k] + itsApriori[k];
    }
    runForward(received);
    runBackward(received);
}

void FloatDecoder::runForward(const Constituent& received)
{
    Metrics metrics = onlyStateZero();
    for (std::size_t k = 0; k < itsK; ++k) {
        itsForward[k] = metrics;
        Metrics next = unreachedStates();
        for (std::size_t state = 0; state < states; ++state) {
            for (const bool bit : {false, true}) {
                const Transition step = transition(state, bit);
                next[step.next] =
                    larger(next[step.next], metrics[state] + branch(bit, step.parity, itsInput[k], received.parity[k]));
            }
        }
        metrics = relative(next);
    }
}

/// The metrics behind the last information bit: the tail leads from each state to state 0.
FloatDecoder::Metrics FloatDecoder::endMetrics(const Constituent& received) const
{
    Metrics metrics = onlyStateZero();
    for (std::size_t k = itsK + rules::tailSteps; k-- > itsK;) {
        Metrics before;
        for (std::size_t state = 0; state < states; ++state) {
            const bool bit = terminatingBit(state);
            const Transition step = transition(state, bit);
            before[state] = metrics[step.next] + branch(bit, step.parity, received.systematic[k], received.parity[k]);
        }
        metrics = before;
    }
    return metrics;
}

void FloatDecoder::runBackward(const Constituent& received)
{
    Metrics metrics = endMetrics(received);
    for (std::size_t k = itsK; k-- > 0;) {
        Metrics before = unreachedStates();
        Values zero = before[0];
        Values one = before[0];
        for (std::size_t state = 0; state < states; ++state) {
            for (const bool bit : {false, true}) {
                const Transition step = transition(state, bit);
                const Values path = metrics[step.next] + branch(bit, step.parity, itsInput[k], received.parity[k]);
                before[state] = larger(before[state], path);
                Values& decided = bit ? one : zero;
                decided = larger(decided, itsForward[k][state] + path);
            }
        }
        itsTotal[k] = one - zero;
        itsExtrinsic[k] = extrinsicScale * (itsTotal[k] - itsInput[k]);
        metrics = relative(before);
    }
}

FloatDecoder::Metrics FloatDecoder::unreachedStates()
{
    Metrics metrics;
    metrics.fill(Values{} + unreached);
    return metrics;
}

/// Of paths that begin or end in state 0.
FloatDecoder::Metrics FloatDecoder::onlyStateZero()
{
    Metrics metrics = unreachedStates();
    metrics[0] = Values{};
    return metrics;
}

/// The metrics less that of state 0, so that long blocks lose no precision.
FloatDecoder::Metrics FloatDecoder::relative(const Metrics& metrics)
{
    Metrics differences;
    for (std::size_t state = 0; state < states; ++state) {
        differences[state] = metrics[state] - metrics[0];
    }
    return differences;
}

}  // namespace morvik::validation

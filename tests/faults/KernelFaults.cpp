// KernelFaults: wrong branch metrics, recursions and log-likelihood ratios.
#include <algorithm>
#include <array>
#include <cstdint>
#include <cstdlib>
#include <utility>
#include <vector>

#include "Fault.h"
#include "rules/Arithmetic.h"
#include "rules/Trellis.h"
#include "rules/TrellisDecision.h"

namespace morvik::faults {

namespace {

using morvik::rules::clip;
using morvik::rules::wrap16;

constexpr int lowestBranch = -2048;
constexpr int highestBranch = 2032;

/// An engine with the settings of another.
class FaultyEngine : public TCalculationEngineModBase {
public:
    explicit FaultyEngine(const TCalculationEngineModBase& sound) : TCalculationEngineModBase(sound) {}

    std::string getProperties() const override
    {
        return "faulty";
    }
};

/// Branch metrics by another formula.
class OtherBranches : public FaultyEngine {
public:
    using FaultyEngine::FaultyEngine;

    T8* gamma(unsigned n, const short* intrinsic, const short* parity0, const short*, T8* g) override
    {
        for (unsigned k = 0; k < n; ++k) {
            const int i = 2 * intrinsic[k];
            const int p = parity0[k];
            const std::array<int, 4> sums = {i + p, i - p, i - p, i + p};
            for (unsigned metric = 0; metric < sums.size(); ++metric) {
                const bool parityIsNegated = metric == 1 || metric == 2;
                g[k][metric] = branch(sums[metric], parityIsNegated && p == -2048);
            }
        }
        return g + n;
    }

private:
    /// A branch metric from its sum; the most negative parity may be negated in it.
    virtual short branch(int sum, bool lowestParityNegated) const = 0;
};

class UnclippedBranches : public OtherBranches {
    using OtherBranches::OtherBranches;

    short branch(int sum, bool) const override
    {
        return wrap16(sum);
    }
};

class BranchesOfEightBits : public OtherBranches {
    using OtherBranches::OtherBranches;

    short branch(int sum, bool) const override
    {
        return wrap16(static_cast<signed char>(sum / 16) * 16);
    }
};

template <int bits>
class NarrowBranches : public OtherBranches {
    using OtherBranches::OtherBranches;

    short branch(int sum, bool) const override
    {
        constexpr int end = 16 << (bits - 1);
        return wrap16(clip(sum, -end, end - 16));
    }
};

class ParityNegatedInEight : public OtherBranches {
    using OtherBranches::OtherBranches;

    /// In eight bits, -128 negated stays -128.
    short branch(int sum, bool lowestParityNegated) const override
    {
        return wrap16(clip(lowestParityNegated ? sum - 4096 : sum, lowestBranch, highestBranch));
    }
};

class NegatedParity : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    T8* gamma(unsigned n, const short* intrinsic, const short* parity0, const short* parity1, T8* g) override
    {
        std::vector<short> negated(parity0, parity0 + n);
        for (short& value : negated) {
            value = wrap16(-value);
        }
        return FaultyEngine::gamma(n, intrinsic, negated.data(), parity1, g);
    }
};

class IntrinsicDoubledInEight : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    T8* gamma(unsigned n, const short* intrinsic, const short* parity0, const short* parity1, T8* g) override
    {
        std::vector<short> cut(intrinsic, intrinsic + n);
        for (short& value : cut) {
            value = wrap16(8 * static_cast<signed char>(2 * value / 16));
        }
        return FaultyEngine::gamma(n, cut.data(), parity0, parity1, g);
    }
};

class BackwardUncorrected : public FaultyEngine {
public:
    explicit BackwardUncorrected(const TCalculationEngineModBase& sound) : FaultyEngine(sound)
    {
        itsBetaAlgorithmType = MOD;
    }
};

class ForwardCorrectedEarly : public FaultyEngine {
public:
    explicit ForwardCorrectedEarly(const TCalculationEngineModBase& sound) : FaultyEngine(sound)
    {
        itsAlphaAlgorithmType = MOD_STAR;
    }
};

/// The table of an algorithm that has one, read by the magnitude of a negative difference.
class TableByMagnitude : public FaultyEngine {
public:
    explicit TableByMagnitude(const TCalculationEngineModBase& sound) : FaultyEngine(sound)
    {
        if (sound.itsAlphaLUT == nullptr) {
            return;
        }
        for (int difference = INT16_MIN; difference <= INT16_MAX; ++difference) {
            itsTable.push_back(sound.itsAlphaLUT[std::min(std::abs(difference), INT16_MAX)]);
        }
        itsAlphaLUT = itsBetaLUT = itsLLRLUT = itsTable.data() - INT16_MIN;
    }

private:
    std::vector<unsigned char> itsTable;
};

/// Each column is altered as soon as it is computed, and the next one is computed from it. It suits max-log-MAP, of
/// whose decisions nothing is pending from one step to the next.
class AlteredColumns : public FaultyEngine {
public:
    using FaultyEngine::FaultyEngine;

    T8* alpha(unsigned n, const T8* g, T8* a) override
    {
        for (unsigned j = 1; j < n; ++j) {
            FaultyEngine::alpha(2, g + j - 1, a + j - 1);
            alterForward(a[j]);
        }
        return a + n;
    }

    T8* beta(unsigned n, const T8* g, T8* b) override
    {
        for (unsigned j = 1; j < n; ++j) {
            FaultyEngine::beta(2, g - (j - 1), b - (j - 1));
            alterBackward(*(b - j));
        }
        return b - n;
    }

private:
    virtual void alterForward(T8& column) const = 0;
    virtual void alterBackward(T8& column) const = 0;
};

class StatesSwapped : public AlteredColumns {
    using AlteredColumns::AlteredColumns;

    void alterForward(T8& column) const override
    {
        std::swap(column[2], column[3]);
    }

    void alterBackward(T8&) const override {}
};

void cutToElevenBits(T8& column)
{
    for (short& metric : column.metric) {
        metric = static_cast<short>(wrap16(2 * metric) / 2);
    }
}

class StoredInElevenBits : public AlteredColumns {
    using AlteredColumns::AlteredColumns;

    void alterForward(T8& column) const override
    {
        cutToElevenBits(column);
    }

    void alterBackward(T8& column) const override
    {
        cutToElevenBits(column);
    }
};

/// The recursions go on with twelve bits.
class KeptInElevenBits : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    T8* alpha(unsigned n, const T8* g, T8* a) override
    {
        T8* const end = FaultyEngine::alpha(n, g, a);
        std::for_each(a + 1, a + n, cutToElevenBits);
        return end;
    }

    T8* beta(unsigned n, const T8* g, T8* b) override
    {
        T8* const end = FaultyEngine::beta(n, g, b);
        std::for_each(b - (n - 1), b, cutToElevenBits);
        return end;
    }
};

/// Log-likelihood ratios that are altered once they are computed.
class NegatedRatios : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        short* const end = FaultyEngine::llr(n, a, b, g, out);
        std::transform(out, out + n, out, [](short ratio) { return wrap16(-ratio); });
        return end;
    }
};

class RoundedRatios : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        short* const end = FaultyEngine::llr(n, a, b, g, out);
        for (unsigned k = 0; k < n; ++k) {
            out[k] = wrap16(out[k] + (a[k][0] & 16));
        }
        return end;
    }
};

/// A metric in other arithmetic than that of 16 bits which wrap: Sum gives the sum's value, and compares.
template <class Sum>
struct Metric {
    short value;

    friend constexpr Metric addWrap(Metric a, Metric b)
    {
        return {Sum::of(a.value + b.value)};
    }

    friend constexpr Metric subWrap(Metric a, Metric b)
    {
        return {Sum::of(a.value - b.value)};
    }

    friend constexpr Metric maxWrap(Metric a, Metric b)
    {
        return Sum::isLess(a.value, b.value) ? b : a;
    }
};

/// Compares by the sign of a difference.
template <class Sum>
struct ComparedBySign {
    static constexpr bool isLess(int a, int b)
    {
        return Sum::of(a - b) < 0;
    }
};

struct Saturated : ComparedBySign<Saturated> {
    static constexpr short of(int sum)
    {
        return wrap16(clip(sum, -32768, 32752));
    }
};

/// Metrics that wrap, but are compared as plain numbers.
struct ComparedPlainly {
    static constexpr short of(int sum)
    {
        return wrap16(sum);
    }

    static constexpr bool isLess(int a, int b)
    {
        return a < b;
    }
};

template <int bits>
struct Wrapped : ComparedBySign<Wrapped<bits>> {
    static constexpr short of(int sum)
    {
        constexpr int above = 1 << (12 - bits);
        return static_cast<short>(wrap16(above * sum) / above);
    }
};

template <class Sum>
std::array<Metric<Sum>, rules::stateCount> metrics(const T8& column)
{
    std::array<Metric<Sum>, rules::stateCount> values{};
    for (unsigned state = 0; state < rules::stateCount; ++state) {
        values[state].value = column[state];
    }
    return values;
}

template <class Sum>
rules::BranchMetrics<Metric<Sum>> branches(const T8& g)
{
    return {{{g[0]}, {g[1]}, {g[2]}, {g[3]}}};
}

template <class Sum>
void store(const std::array<Metric<Sum>, rules::stateCount>& values, T8& column)
{
    for (unsigned state = 0; state < rules::stateCount; ++state) {
        column[state] = values[state].value;
    }
}

/// Ratios of max-log-MAP in another arithmetic.
template <class Sum>
class OtherRatios : public FaultyEngine {
public:
    using FaultyEngine::FaultyEngine;

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        for (unsigned k = 0; k < n; ++k) {
            out[k] =
                rules::logLikelihoodRatio(itsRule, metrics<Sum>(a[k]), metrics<Sum>(b[k]), branches<Sum>(g[k])).value;
        }
        return out + n;
    }

protected:
    rules::DecideMax<Metric<Sum>> itsRule;
};

/// All of max-log-MAP in another arithmetic.
template <class Sum>
class OtherMetrics : public OtherRatios<Sum> {
public:
    using OtherRatios<Sum>::OtherRatios;

    T8* alpha(unsigned n, const T8* g, T8* a) override
    {
        for (unsigned j = 1; j < n; ++j) {
            store(rules::forwardStep(this->itsRule, metrics<Sum>(a[j - 1]), branches<Sum>(g[j - 1])), a[j]);
        }
        return a + n;
    }

    T8* beta(unsigned n, const T8* g, T8* b) override
    {
        for (unsigned j = 1; j < n; ++j, --g, --b) {
            store(rules::backwardStep(this->itsRule, metrics<Sum>(*b), branches<Sum>(*g)), *(b - 1));
        }
        return b - 1;
    }
};

short lesserOf(int c1, int c2)
{
    return wrap16(wrap16(c1 - c2) < 0 ? c1 : c2);
}

/// One state keeps the lesser of its candidates.
class ForwardLesser : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    T8* alpha(unsigned n, const T8* g, T8* a) override
    {
        constexpr unsigned state = 5;
        constexpr unsigned one = rules::predecessor(state, 1);
        constexpr unsigned zero = rules::predecessor(state, 0);
        for (unsigned j = 1; j < n; ++j) {
            FaultyEngine::alpha(2, g + j - 1, a + j - 1);
            const short branch = g[j - 1][rules::branch(one)];
            a[j][state] = lesserOf(a[j - 1][one] + branch, a[j - 1][zero] - branch);
        }
        return a + n;
    }
};

class BackwardLesser : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    T8* beta(unsigned n, const T8* g, T8* b) override
    {
        constexpr unsigned state = 2;
        for (unsigned j = 1; j < n; ++j, --g, --b) {
            FaultyEngine::beta(2, g, b);
            const T8& from = *b;
            const short branch = (*g)[rules::branch(state)];
            (*(b - 1))[state] =
                lesserOf(from[rules::successor(state, 1)] + branch, from[rules::successor(state, 0)] - branch);
        }
        return b - 1;
    }
};

/// A decision in the tree of max-log-MAP's ratios keeps the lesser: the one between two states or, if it has none, the
/// one between the two halves.
template <unsigned bit, int pair>
class RatioLesser : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        for (unsigned k = 0; k < n; ++k) {
            out[k] = wrap16(best(1, a[k], b[k], g[k]) - best(0, a[k], b[k], g[k]));
        }
        return out + n;
    }

    static short decided(int c1, int c2, bool takesLesser)
    {
        const short greater = rules::maxWrap(wrap16(c1), wrap16(c2));
        return takesLesser ? lesserOf(c1, c2) : greater;
    }

    static short best(unsigned of, const T8& a, const T8& b, const T8& g)
    {
        std::array<short, 4> pairs{};
        for (unsigned i = 0; i < pairs.size(); ++i) {
            const auto path = [&](unsigned state) {
                return a[state] + b[rules::successor(state, of)];
            };
            const short kept = decided(path(2 * i + 1), path(2 * i), of == bit && pair == static_cast<int>(i));
            pairs[i] = wrap16(of != 0 ? kept + g[i] : kept - g[i]);
        }
        return decided(decided(pairs[0], pairs[1], false), decided(pairs[2], pairs[3], false), of == bit && pair < 0);
    }
};

/// Operands of another step than the one at hand.
class RatioOfNextBranch : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        FaultyEngine::llr(n - 1, a, b, g + 1, out);
        return out + n;
    }
};

class RatioOfBranchBefore : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        FaultyEngine::llr(1, a, b, g, out);
        return FaultyEngine::llr(n - 1, a + 1, b + 1, g, out + 1);
    }
};

class RatioOfNextForward : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        FaultyEngine::llr(n - 1, a + 1, b, g, out);
        return out + n;
    }
};

class ForwardOfNextBranch : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    T8* alpha(unsigned n, const T8* g, T8* a) override
    {
        return FaultyEngine::alpha(n, g + 1, a);
    }
};

/// A bit of the address of the forward metrics' memory is stuck where the ratios read it.
class RatioAddressBit : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        for (unsigned k = 0; k < n; ++k) {
            FaultyEngine::llr(1, a + (k & ~32U), b + k, g + k, out + k);
        }
        return out + n;
    }
};

/// A cell of the forward metrics' memory, which each window of 64 steps uses anew, reads as zeros.
class RatioCellDead : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        const T8 zeros{};
        for (unsigned k = 0; k < n; ++k) {
            FaultyEngine::llr(1, k % 64 == 5 ? &zeros : a + k, b + k, g + k, out + k);
        }
        return out + n;
    }
};

/// The last subtraction of a ratio is wider, and is clipped to so many bits.
template <int bits>
class ClippedRatios : public FaultyEngine {
    using FaultyEngine::FaultyEngine;

    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override
    {
        const rules::DecideMax<short> rule;
        const auto column = [](const T8& values) {
            std::array<short, rules::stateCount> copy{};
            std::copy_n(values.metric, copy.size(), copy.begin());
            return copy;
        };
        for (unsigned k = 0; k < n; ++k) {
            const rules::BranchMetrics<short> of = {g[k][0], g[k][1], g[k][2], g[k][3]};
            const int one = rules::bestPath<1>(rule, column(a[k]), column(b[k]), of);
            const int zero = rules::bestPath<0>(rule, column(a[k]), column(b[k]), of);
            constexpr int end = 16 << (bits - 1);
            out[k] = wrap16(clip(one - zero, -end, end - 16));
        }
        return out + n;
    }
};

}  // namespace

const std::vector<Fault>& kernelFaults()
{
    static const std::vector<Fault> faults = {
        inEngine<UnclippedBranches>("branch_unclipped"),
        inEngine<BranchesOfEightBits>("branch_eight_bits"),
        inEngine<NarrowBranches<7>>("branch_seven_bits"),
        inEngine<NarrowBranches<5>>("branch_five_bits"),
        inEngine<NegatedParity>("parity_sign"),
        inEngine<ParityNegatedInEight>("parity_negated_in_eight"),
        inEngine<IntrinsicDoubledInEight>("doubled_in_eight"),
        inEngine<BackwardUncorrected>("backward_uncorrected"),
        inEngine<ForwardCorrectedEarly>("forward_corrected_early"),
        inEngine<TableByMagnitude>("table_by_magnitude"),
        inEngine<StatesSwapped>("forward_state_swapped"),
        inEngine<OtherMetrics<Saturated>>("metrics_unwrapped"),
        inEngine<OtherMetrics<ComparedPlainly>>("metrics_compared_plainly"),
        inEngine<OtherMetrics<Wrapped<11>>>("metrics_eleven_bits"),
        inEngine<OtherRatios<Wrapped<7>>>("ratio_seven_bits"),
        inEngine<StoredInElevenBits>("metrics_stored_in_eleven_bits"),
        inEngine<KeptInElevenBits>("metrics_kept_in_eleven_bits"),
        inEngine<ForwardLesser>("forward_lesser"),
        inEngine<BackwardLesser>("backward_lesser"),
        inEngine<RatioLesser<1, 2>>("ratio_lesser_of_states"),
        inEngine<RatioLesser<0, -1>>("ratio_lesser_of_halves"),
        inEngine<RatioOfNextBranch>("ratio_branch_behind"),
        inEngine<RatioOfBranchBefore>("ratio_branch_before"),
        inEngine<RatioOfNextForward>("ratio_forward_behind"),
        inEngine<ForwardOfNextBranch>("forward_branch_behind"),
        inEngine<RatioAddressBit>("ratio_address_bit"),
        inEngine<RatioCellDead>("ratio_cell_dead"),
        inEngine<NegatedRatios>("ratio_sign"),
        inEngine<RoundedRatios>("ratio_rounding"),
        inEngine<ClippedRatios<12>>("ratio_unwrapped"),
        inEngine<ClippedRatios<9>>("ratio_clipped_to_nine_bits"),
    };
    return faults;
}

}  // namespace morvik::faults

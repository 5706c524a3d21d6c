// TCalculationEngineModBase: the trellis kernels in their three variants, and the correction table.
#include "TCalculationEngineModBase.h"

#include <algorithm>
#include <array>
#include <istream>
#include <ostream>

#include "Messages.h"
#include "TraceTable.h"
#include "rules/Arithmetic.h"
#include "rules/Correction.h"
#include "rules/Trellis.h"
#include "rules/TrellisDecision.h"

namespace rules = morvik::rules;

namespace {

using morvik::rules::Value;
using morvik::rules::wrap16;
using BranchMetrics = rules::BranchMetrics<Value>;
using StateMetrics = std::array<Value, rules::stateCount>;

/// Looks up the correction of a decision difference in an engine's table.
struct Corrections {
    const unsigned char* anchor;

    constexpr Value operator()(Value difference) const
    {
        return anchor[difference];
    }
};

using Max = rules::DecideMax<Value>;
using MaxStar = rules::DecideMaxStar<Value, Corrections>;
using MaxHash = rules::DecideMaxHash<Value, Corrections>;

BranchMetrics branchMetrics(const T8& g)
{
    return {g[0], g[1], g[2], g[3]};
}

StateMetrics stateMetrics(const T8& column)
{
    return {column[0], column[1], column[2], column[3], column[4], column[5], column[6], column[7]};
}

template <class Decision>
rules::Column<Decision> load(const Decision& rule, const T8& column)
{
    rules::Column<Decision> metrics{};
    for (unsigned state = 0; state < rules::stateCount; ++state) {
        metrics[state] = rule.metric(column[state]);
    }
    return metrics;
}

template <class Decision>
void store(const Decision& rule, const rules::Column<Decision>& metrics, T8& column)
{
    for (unsigned state = 0; state < rules::stateCount; ++state) {
        column[state] = rule.stored(metrics[state]);
    }
}

template <class Decision>
T8* forward(const Decision& rule, unsigned n, const T8* g, T8* a)
{
    auto metrics = load(rule, *a);
    for (unsigned j = 1; j < n; ++j) {
        metrics = rules::forwardStep(rule, metrics, branchMetrics(g[j - 1]));
        store(rule, metrics, a[j]);
    }
    return a + n;
}

template <class Decision>
T8* backward(const Decision& rule, unsigned n, const T8* g, T8* b)
{
    auto metrics = load(rule, *b);
    for (unsigned j = 1; j < n; ++j) {
        metrics = rules::backwardStep(rule, metrics, branchMetrics(*g--));
        store(rule, metrics, *--b);
    }
    return b - 1;
}

template <class Decision>
short* ratios(const Decision& rule, unsigned n, const T8* a, const T8* b, const T8* g, short* out)
{
    for (unsigned k = 0; k < n; ++k) {
        out[k] = rules::logLikelihoodRatio(rule, stateMetrics(a[k]), stateMetrics(b[k]), branchMetrics(g[k]));
    }
    return out + n;
}

/// Runs the variant of a kernel, "MOD", "MOD*" or "MOD#", that the algorithm type selects.
template <class Result, class... Arguments>
Result* runVariant(const TCalculationEngineModBase& engine,
                   TCalculationEngineModBase::AlgorithmType type,
                   const char* kernel,
                   Result* (TCalculationEngineModBase::*const (&variants)[3])(Arguments...) const,
                   Arguments... arguments)
{
    if (engine.itsUseSSE2) {
        return nullptr;
    }
    if (type < TCalculationEngineModBase::MOD || type > TCalculationEngineModBase::MOD_HASH) {
        morvik::messages::writeError("ERROR:TCalculationEngineModBase::", kernel, ":Illegal algorithm type");
        return nullptr;
    }
    return (engine.*variants[type - TCalculationEngineModBase::MOD])(arguments...);
}

}  // namespace

T8* TCalculationEngineModBase::gamma(
    unsigned n, const short* intrinsic, const short* parity0, const short* parity1, T8* g)
{
    return itsUseSSE2 ? nullptr : mod_gamma(n, intrinsic, parity0, parity1, g);
}

T8* TCalculationEngineModBase::alpha(unsigned n, const T8* g, T8* a)
{
    using Engine = TCalculationEngineModBase;
    return runVariant(*this,
                      itsAlphaAlgorithmType,
                      "alpha",
                      {&Engine::mod_alpha, &Engine::modstar_alpha, &Engine::modhash_alpha},
                      n,
                      g,
                      a);
}

T8* TCalculationEngineModBase::beta(unsigned n, const T8* g, T8* b)
{
    using Engine = TCalculationEngineModBase;
    return runVariant(*this,
                      itsBetaAlgorithmType,
                      "beta",
                      {&Engine::mod_beta, &Engine::modstar_beta, &Engine::modhash_beta},
                      n,
                      g,
                      b);
}

short* TCalculationEngineModBase::llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out)
{
    using Engine = TCalculationEngineModBase;
    return runVariant(*this,
                      itsLLRAlgorithmType,
                      "llr",
                      {&Engine::mod_llr, &Engine::modstar_llr, &Engine::modhash_llr},
                      n,
                      a,
                      b,
                      g,
                      out);
}

T8* TCalculationEngineModBase::mod_gamma(
    unsigned n, const short* intrinsic, const short* parity0, const short* parity1, T8* g) const
{
    // The limits are the branch format's integers, aligned like state metrics: -2048 and 2032 (rule 5).
    const std::int32_t lo = wrap16(rules::shiftLeftWrap(itsBranchFormat->itsMinQ, itsStateFormat->itsShift));
    const std::int32_t hi = wrap16(rules::shiftLeftWrap(itsBranchFormat->itsMaxQ, itsStateFormat->itsShift));
    for (unsigned k = 0; k < n; ++k) {
        auto metrics = rules::branchSums<std::int32_t>(2 * intrinsic[k], parity0[k], parity1[k]);
        rules::clipBranches(metrics, lo, hi);
        for (unsigned i = 0; i < metrics.size(); ++i) {
            g[k][i] = wrap16(metrics[i]);
        }
    }
    return g + n;
}

T8* TCalculationEngineModBase::mod_alpha(unsigned n, const T8* g, T8* a) const
{
    return forward(Max{}, n, g, a);
}

T8* TCalculationEngineModBase::mod_beta(unsigned n, const T8* g, T8* b) const
{
    return backward(Max{}, n, g, b);
}

short* TCalculationEngineModBase::mod_llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) const
{
    return ratios(Max{}, n, a, b, g, out);
}

T8* TCalculationEngineModBase::modstar_alpha(unsigned n, const T8* g, T8* a) const
{
    return forward(MaxStar(Corrections{itsAlphaLUT}), n, g, a);
}

T8* TCalculationEngineModBase::modstar_beta(unsigned n, const T8* g, T8* b) const
{
    return backward(MaxStar(Corrections{itsBetaLUT}), n, g, b);
}

short* TCalculationEngineModBase::modstar_llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) const
{
    return ratios(MaxStar(Corrections{itsLLRLUT}), n, a, b, g, out);
}

T8* TCalculationEngineModBase::modhash_alpha(unsigned n, const T8* g, T8* a) const
{
    return forward(MaxHash(Corrections{itsAlphaLUT}), n, g, a);
}

T8* TCalculationEngineModBase::modhash_beta(unsigned n, const T8* g, T8* b) const
{
    return backward(MaxHash(Corrections{itsBetaLUT}), n, g, b);
}

short* TCalculationEngineModBase::modhash_llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) const
{
    return ratios(MaxHash(Corrections{itsLLRLUT}), n, a, b, g, out);
}

bool TCalculationEngineModBase::hasSSE2()
{
    return false;
}

std::vector<unsigned char> TCalculationEngineModBase::createLUT(unsigned points, const TNumberFormat& stateFormat)
{
    const std::uint32_t fractionAndShift = stateFormat.itsBinPt + stateFormat.itsShift;
    if (fractionAndShift >= 9) {
        morvik::messages::writeError(
            "ERROR:TCalculationEngineModBase::createLUT:Binary point of state metrics is incompatible with "
            "8 bit lookup tables");
        return {};
    }
    const std::uint64_t range = points == 0 ? rules::correctionEntries : points;
    std::uint32_t log2Range = 0;
    while ((std::uint64_t{1} << log2Range) < range) {
        ++log2Range;
    }
    if ((std::uint64_t{1} << log2Range) != range) {
        morvik::messages::writeError(
            "ERROR:TCalculationEngineModBase::createLUT:Number of points must be a binary number");
        return {};
    }
    const std::uint32_t ignored = fractionAndShift - rules::resolvedFractionBits(stateFormat.itsBinPt, log2Range);
    std::vector<unsigned char> lut;
    lut.reserve(rules::correctionEntries);
    for (std::int32_t difference = -32768; difference <= 32767; ++difference) {
        const std::int32_t correction = rules::correction(
            difference, ignored, static_cast<long double>(range), stateFormat.itsShift, stateFormat.itsScale);
        lut.push_back(static_cast<unsigned char>(stateFormat.place(correction) & 0xFF));  // eight bits
    }
    return lut;
}

std::ostream& operator<<(std::ostream& os, TCalculationEngineModBase::AlgorithmType type)
{
    switch (type) {
    case TCalculationEngineModBase::MOD:
        return os << "MOD";
    case TCalculationEngineModBase::MOD_STAR:
        return os << "MOD*";
    case TCalculationEngineModBase::MOD_HASH:
        return os << "MOD#";
    case TCalculationEngineModBase::UNKNOWN:
        break;
    }
    return os << "<unknown>";
}

std::istream& operator>>(std::istream& is, TCalculationEngineModBase::AlgorithmType& type)
{
    type = TCalculationEngineModBase::UNKNOWN;
    for (const char letter : {'M', 'O', 'D'}) {
        const int next = is.peek();
        if (!is || (next != letter && next != letter - 'A' + 'a')) {
            return is;
        }
        is.get();
    }
    const int next = is.peek();
    if (next == '*' || next == '#') {
        is.get();
        type = next == '*' ? TCalculationEngineModBase::MOD_STAR : TCalculationEngineModBase::MOD_HASH;
    } else if (next <= ' ' || next == ':') {  // the end of the input is -1
        type = TCalculationEngineModBase::MOD;
    }
    return is;
}

void dumpGamma(std::ostream& os,
               unsigned n,
               const short* intrinsic,
               const short* parity0,
               const short* parity1,
               const T8* g1,
               const T8* g2,
               const TNumberFormat& format)
{
    morvik::messages::writeLine(
        os,
        "n    intrinsic   parity0     parity1        g1[0]        g1[1]        g1[2]        g1[3]  "
        "        g2[0]        g2[1]        g2[2]        g2[3]");
    TraceRow row(format);
    for (unsigned k = 0; k < n; ++k) {
        row.begin(k);
        row.value(intrinsic[k]);
        row.value(parity0[k]);
        row.value(parity1[k]);
        row.gap();
        row.compared(g1[k], g2[k], 0, 3);
        row.gap();
        row.compared(g2[k], g1[k], 0, 3);
        row.end(os);
    }
}

void dumpAlphaBeta(std::ostream& os, unsigned n, const T8* g, const T8* ab1, const T8* ab2, const TNumberFormat& format)
{
    morvik::messages::writeLine(
        os,
        "n    g4          g5          g6          g7             ab1[0]       ab1[1]       ab1[2]   "
        "    ab1[3]       ab1[4]       ab1[5]       ab1[6]       ab1[7]         ab2[0]       ab2[1]  "
        "     ab2[2]       ab2[3]       ab2[4]       ab2[5]       ab2[6]       ab2[7]");
    TraceRow row(format);
    for (unsigned k = 0; k < n; ++k) {
        row.begin(k);
        row.values(g[k], 4, 7);
        row.gap();
        row.compared(ab1[k], ab2[k], 0, 7);
        row.gap();
        row.compared(ab2[k], ab1[k], 0, 7);
        row.end(os);
    }
}

void dumpExtrinsic(std::ostream& os,
                   unsigned n,
                   const T8* a,
                   const T8* b,
                   const T8* g,
                   const short* e1,
                   const short* e2,
                   const TNumberFormat& format)
{
    morvik::messages::writeLine(
        os,
        "n    a[0]        a[1]        a[2]        a[3]        a[4]        a[5]        a[6]        "
        "a[7]          b[0]        b[1]        b[2]        b[3]        b[4]        b[5]        b[6]  "
        "      b[7]          g[4]        g[5]        g[6]        g[7]           e1           e2");
    TraceRow row(format);
    for (unsigned k = 0; k < n; ++k) {
        row.begin(k);
        row.values(a[k], 0, 7);
        row.gap();
        row.values(b[k], 0, 7);
        row.gap();
        row.values(g[k], 4, 7);
        row.gap();
        row.compared(e1[k], e2[k]);
        row.compared(e2[k], e1[k]);
        row.end(os);
    }
}

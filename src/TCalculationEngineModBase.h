// TCalculationEngineModBase: the trellis kernels in their three variants, and the correction table.
#ifndef MORVIK_SRC_TCALCULATIONENGINEMODBASE_H
#define MORVIK_SRC_TCALCULATIONENGINEMODBASE_H

#include <cstdint>
#include <iosfwd>
#include <vector>

#include "TCalculationEngine.h"

/// Implements the max-log-MAP kernels. alpha, beta and llr each have their own algorithm type and
/// anchor, the middle entry of a correction table: anchor[d] is the correction of the decision
/// difference d, -32768 to 32767.
class MORVIK_API TCalculationEngineModBase : public TCalculationEngine {
public:
    /// The decision between two candidate metrics, with its printed text.
    enum AlgorithmType : std::int32_t {
        UNKNOWN = 0,   ///< "<unknown>": no valid type
        MOD = 1,       ///< "MOD": the greater candidate
        MOD_STAR = 2,  ///< "MOD*": plus the correction of this decision
        MOD_HASH = 3,  ///< "MOD#": plus the correction of the winner's last decision
    };

    AlgorithmType itsAlphaAlgorithmType = MOD;
    AlgorithmType itsBetaAlgorithmType = MOD;
    AlgorithmType itsLLRAlgorithmType = MOD;
    const unsigned char* itsAlphaLUT = nullptr;  ///< anchor, not owned; read by "MOD*" and "MOD#"
    const unsigned char* itsBetaLUT = nullptr;   ///< anchor, not owned
    const unsigned char* itsLLRLUT = nullptr;    ///< anchor, not owned

    /// The kernels, dispatched on the algorithm types. An illegal type gives null, after one line on
    /// standard error.
    T8* gamma(unsigned n, const short* intrinsic, const short* parity0, const short* parity1, T8* g) override;
    T8* alpha(unsigned n, const T8* g, T8* a) override;
    T8* beta(unsigned n, const T8* g, T8* b) override;
    short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) override;

    /// The kernels of each variant, regardless of the engine's algorithm types.
    T8* mod_gamma(unsigned n, const short* intrinsic, const short* parity0, const short* parity1, T8* g) const;
    T8* mod_alpha(unsigned n, const T8* g, T8* a) const;
    T8* mod_beta(unsigned n, const T8* g, T8* b) const;
    short* mod_llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) const;
    T8* modstar_alpha(unsigned n, const T8* g, T8* a) const;
    T8* modstar_beta(unsigned n, const T8* g, T8* b) const;
    short* modstar_llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) const;
    T8* modhash_alpha(unsigned n, const T8* g, T8* a) const;
    T8* modhash_beta(unsigned n, const T8* g, T8* b) const;
    short* modhash_llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) const;

    /// Whether there are SSE2 kernels for itsUseSSE2: false.
    static bool hasSSE2();

    /// Returns the correction table ln(1 + e^-|d|) for `points` points, 0 meaning 65536: 65536
    /// entries, entry d + 32768 for difference d, aligned like the state format (rule 9). Empty, after
    /// one line on standard error, if `points` is not a power of two or an aligned correction would
    /// not fit in eight bits.
    static std::vector<unsigned char> createLUT(unsigned points, const TNumberFormat& stateFormat);
};

/// Writes the text of an algorithm type.
MORVIK_API std::ostream& operator<<(std::ostream& os, TCalculationEngineModBase::AlgorithmType type);

/// Reads "MOD", "MOD*" or "MOD#" in any case; plain "MOD" must be followed by a blank, ":" or the
/// end. Anything else sets the type to UNKNOWN and leaves the offending character unread.
MORVIK_API std::istream& operator>>(std::istream& is, TCalculationEngineModBase::AlgorithmType& type);

/// The following functions write tables of kernel values, for tracing and for comparing two implementations: a header
/// line, then a row for each of n trellis steps. Values are real numbers of `format` (the state format for all kernel
/// values). "*" marks elements in which the two compared arrays differ.

/// The inputs of gamma, and two columns of branch metrics, elements 0 to 3, compared.
MORVIK_API void dumpGamma(std::ostream& os,
                          unsigned n,
                          const short* intrinsic,
                          const short* parity0,
                          const short* parity1,
                          const T8* g1,
                          const T8* g2,
                          const TNumberFormat& format);

/// Elements 4 to 7 of g, and two columns of state metrics compared.
MORVIK_API void dumpAlphaBeta(
    std::ostream& os, unsigned n, const T8* g, const T8* ab1, const T8* ab2, const TNumberFormat& format);

/// The source columns of a ratio or extrinsic value, including elements 4 to 7 of g, and two such
/// values compared.
MORVIK_API void dumpExtrinsic(std::ostream& os,
                              unsigned n,
                              const T8* a,
                              const T8* b,
                              const T8* g,
                              const short* e1,
                              const short* e2,
                              const TNumberFormat& format);

#endif

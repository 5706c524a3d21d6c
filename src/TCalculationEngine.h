// TCalculationEngine: the family of trellis calculation engines and its factory.
#ifndef MORVIK_SRC_TCALCULATIONENGINE_H
#define MORVIK_SRC_TCALCULATIONENGINE_H

#include <string>
#include <vector>

#include "T8.h"
#include "TNumberFormat.h"
#include "morvik_v1_0_bitacc_cmodel.h"

/// Computes the four kernels of a soft-in/soft-out pass over a range of trellis steps.
///
/// Order of use: create, set the three formats, `initialise`, then call kernels in any order. The
/// formats are not owned and must outlive the engine. All values are left-aligned 16-bit words of
/// the state format. A kernel returns a pointer past its range, or null if it cannot run.
class MORVIK_API TCalculationEngine {
public:
    bool itsUseSSE2 = false;  ///< requests SSE2 kernels; there are none, so the kernels return null
    const TNumberFormat* itsInputFormat = nullptr;   ///< channel soft values
    const TNumberFormat* itsStateFormat = nullptr;   ///< state metrics
    const TNumberFormat* itsBranchFormat = nullptr;  ///< branch metrics

    virtual ~TCalculationEngine();

    /// The type name and properties in property-string form.
    virtual std::string getProperties() const = 0;

    /// Prepares the engine once its formats are set; returns false if it cannot be used. The base
    /// returns true, and warns on standard output if the state format has more than 16 bits, which
    /// leaves its mask empty.
    virtual bool initialise();

    /// Branch metrics: g[k], elements 0 to 3, from intrinsic[k], parity0[k] and parity1[k], for
    /// k = 0 to n - 1. Returns g + n.
    virtual T8* gamma(unsigned n, const short* intrinsic, const short* parity0, const short* parity1, T8* g) = 0;

    /// Forward state metrics: a[j + 1] from a[j] and g[j], a[0] given, up to a[n - 1], n >= 1. Returns
    /// a + n.
    virtual T8* alpha(unsigned n, const T8* g, T8* a) = 0;

    /// Backward state metrics: b[-j - 1] from b[-j] and g[-j], b[0] given, down to b[-(n - 1)],
    /// n >= 1. Returns b - n.
    virtual T8* beta(unsigned n, const T8* g, T8* b) = 0;

    /// Log-likelihood ratios: out[k] from a[k], b[k] and g[k], for k = 0 to n - 1; positive favours
    /// bit 1. Returns out + n.
    virtual short* llr(unsigned n, const T8* a, const T8* b, const T8* g, short* out) = 0;

    /// Creates an engine from a property string: "MOD", or "MOD#" with an optional ":" and number of
    /// table points. Returns null, after one line on standard error, for any other text. The caller
    /// deletes the engine.
    static TCalculationEngine* create(const std::string& s);

    /// The announced type names: only "MOD".
    static std::vector<std::string> getNames();

protected:
    TCalculationEngine() = default;
    TCalculationEngine(const TCalculationEngine&) = default;
    TCalculationEngine& operator=(const TCalculationEngine&) = default;
};

#endif

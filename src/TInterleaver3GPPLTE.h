// TInterleaver3GPPLTE: the quadratic permutation polynomial interleaver of LTE.
#ifndef MORVIK_SRC_TINTERLEAVER3GPPLTE_H
#define MORVIK_SRC_TINTERLEAVER3GPPLTE_H

#include "TInterleaver.h"

/// The internal interleaver of the LTE turbo code, Pi(i) = (f1 i + f2 i^2) mod K, for the 188 block
/// sizes of 3GPP TS 36.212, Table 5.1.3-3.
class MORVIK_API TInterleaver3GPPLTE : public TInterleaver {
public:
    /// Creates the interleaver. Returns null, after one line on standard error, unless `props` is
    /// empty. The caller deletes it.
    static TInterleaver* create(const std::string& props);

    /// Reserves K entries before it looks K up, so an absurd K throws std::length_error or
    /// std::bad_alloc.
    bool calcInterleaver(std::vector<unsigned>& out, unsigned K) const override;

    std::string getProperties() const override;

    bool valid(unsigned K) const override;

private:
    TInterleaver3GPPLTE() = default;
};

#endif

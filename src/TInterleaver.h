// TInterleaver: the base class of interleavers, its permutation tables and its factory.
#ifndef MORVIK_SRC_TINTERLEAVER_H
#define MORVIK_SRC_TINTERLEAVER_H

#include <string>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"

/// Permutes the K positions of a code block, for each K that it supports.
///
/// The two tables are caches for one block size. A decoder has the table it needs recomputed if its
/// length is not K, then reads it directly.
class MORVIK_API TInterleaver {
public:
    /// Entry i is the input position of the value at position i of the permuted block.
    mutable std::vector<unsigned> itsPi;
    /// The inverse permutation: entry itsPi[i] is i.
    mutable std::vector<unsigned> itsPiInv;

    /// Sets `out` to the permutation for K and returns true; if K is not a block size, empties it and
    /// returns false.
    virtual bool calcInterleaver(std::vector<unsigned>& out, unsigned K) const = 0;

    /// Sets `out`, which must not be itsPi, to the inverse permutation for K, or empties it if K is
    /// not a block size (check with `valid`). Recomputes itsPi if it holds another size. Returns true.
    virtual bool calcDeinterleaver(std::vector<unsigned>& out, unsigned K) const;

    virtual ~TInterleaver();

    /// The property string for which create makes an equal interleaver.
    virtual std::string getProperties() const = 0;

    /// Whether K is a block size. The base accepts every size but 0.
    virtual bool valid(unsigned K) const;

    /// Creates an interleaver from a property string, "3GPPLTE". Returns null, after one line on
    /// standard error, for any other text. The caller deletes it.
    static TInterleaver* create(const std::string& properties);

    /// The type names that create knows.
    static std::vector<std::string> getNames();

    /// Prints the permutation of each valid size from `first` to `last` on standard output, one line
    /// each, preceded by the size if showSize is set.
    void dumpAll(unsigned first, unsigned last, bool showSize);

protected:
    TInterleaver() = default;
    TInterleaver(const TInterleaver&) = default;
    TInterleaver& operator=(const TInterleaver&) = default;
};

#endif

// TInterleaver: the family of interleavers, its permutation tables and its factory.
#ifndef MORVIK_SRC_TINTERLEAVER_H
#define MORVIK_SRC_TINTERLEAVER_H

#include <string>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"

/// An interleaver: a permutation of the K positions of a code block, for each K that it knows.
///
/// The two tables are caches for one block size. A decoder compares the length of the table it
/// needs with K, has it recomputed when they differ, and then reads it directly.
class MORVIK_API TInterleaver {
public:
    /// Entry i is the input position whose value goes to position i of the permuted block.
    mutable std::vector<unsigned> itsPi;
    /// The inverse permutation: entry itsPi[i] is i.
    mutable std::vector<unsigned> itsPiInv;

    /// Replaces `out` by the permutation for K and returns true; for a K that is no block size,
    /// empties it and returns false.
    virtual bool calcInterleaver(std::vector<unsigned>& out, unsigned K) const = 0;

    /// Replaces `out`, which must not be itsPi, by the inverse permutation for K, or empties it for
    /// a K that is no block size (ask `valid`). Brings itsPi to K when it holds another size.
    /// Returns true.
    virtual bool calcDeinterleaver(std::vector<unsigned>& out, unsigned K) const;

    virtual ~TInterleaver();

    /// The property string from which create makes an equal interleaver.
    virtual std::string getProperties() const = 0;

    /// Whether K is a block size. The base knows every size but 0.
    virtual bool valid(unsigned K) const;

    /// Makes an interleaver from a property string, "3GPPLTE"; null after one line on the standard
    /// error stream when the text is another. The caller deletes it.
    static TInterleaver* create(const std::string& properties);

    /// The type names that create knows.
    static std::vector<std::string> getNames();

    /// Prints the permutation of each valid size from `first` to `last` on the standard output
    /// stream, a line each, with the size in front when showSize is set.
    void dumpAll(unsigned first, unsigned last, bool showSize);

protected:
    TInterleaver() = default;
    TInterleaver(const TInterleaver&) = default;
    TInterleaver& operator=(const TInterleaver&) = default;
};

#endif

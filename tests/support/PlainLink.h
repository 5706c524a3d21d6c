// PlainLink: transport blocks step by step as 3GPP TS 36.212, clause 5.1, words it. A second model, which shares no
// code with link/.
#ifndef MORVIK_TESTS_SUPPORT_PLAINLINK_H
#define MORVIK_TESTS_SUPPORT_PLAINLINK_H

#include <vector>

namespace morvik::plain {

using Bits = std::vector<int>;

/// The parity bits of clause 5.1.1 by long division, p_0 first.
Bits crc24A(const Bits& bits);
Bits crc24B(const Bits& bits);

/// Clause 5.1.2, with its names.
struct CodeBlockSizes {
    unsigned C;
    unsigned Kplus;
    unsigned Cplus;
    unsigned Kminus;
    unsigned Cminus;
    unsigned F;

    unsigned size(unsigned r) const
    {
        return r < Cminus ? Kminus : Kplus;
    }
};

CodeBlockSizes codeBlockSizes(unsigned A);

/// The input of the turbo encoder for each code block, filler bits as zeros.
std::vector<Bits> codeBlocks(const Bits& transportBlock);

/// What clauses 5.1.4 and 5.1.5 are told.
struct Format {
    unsigned A;
    unsigned G;
    unsigned Qm;
    unsigned NL;
    unsigned NIR;  ///< 0: no limit
};

/// A bit of a code block before rate matching.
struct Place {
    unsigned r;
    unsigned stream;
    unsigned k;
};

/// Where each of the G bits of a transmission comes from.
std::vector<Place> codedPlaces(const Format& format, unsigned rv);

/// The G bits of a transmission.
Bits encode(const Format& format, unsigned rv, const Bits& transportBlock);

}  // namespace morvik::plain

#endif

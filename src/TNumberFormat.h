// TNumberFormat: a signed fixed-point format and its derived limits.
#ifndef MORVIK_SRC_TNUMBERFORMAT_H
#define MORVIK_SRC_TNUMBERFORMAT_H

#include <cstdint>
#include <iosfwd>
#include <string>

#include "morvik_v1_0_bitacc_cmodel.h"

/// Defines how quantities sit in a 16-bit word: the value q of an N-bit format is stored as
/// q * 2^(16 - N), so that the word wraps where the hardware's N-bit register does (rule 1). All
/// fields are set at construction and only read afterwards.
class MORVIK_API TNumberFormat {
public:
    std::uint32_t itsNBits;  ///< bits of the format, sign included; 1 to 16 when made by create
    std::uint32_t itsBinPt;  ///< fraction bits
    std::uint32_t itsShift;  ///< 16 - bits: the left shift that aligns a value
    std::uint32_t itsScale;  ///< 2^fraction bits: the integer of the number 1
    short itsMin;            ///< most negative value, aligned
    short itsMax;            ///< most positive value, aligned
    std::int32_t itsMinQ;    ///< most negative value as an integer
    std::int32_t itsMaxQ;    ///< most positive value as an integer
    short itsMask;           ///< the bits of the word that the format occupies

    /// Derives the limits with shift counts modulo 32. Unchecked: the limits are meaningful for 1 to
    /// 16 bits only.
    TNumberFormat(std::uint32_t nbits, std::uint32_t binpt);

    /// Creates a format from "Fix_<nbits>_<binpt>", both decimal, 1 <= binpt < nbits <= 16. Returns
    /// null, after one line on standard error, for any other text. The caller deletes the format.
    static TNumberFormat* create(const std::string& properties);

    /// The text for which create makes an equal format.
    std::string getProperties() const;

    /// The aligned word of the integer q, saturated to the format's limits (rule 4).
    short place(std::int32_t q) const;

    /// The integer of an aligned word.
    std::int32_t integer(short aligned) const;

    /// The real number of an aligned word.
    long double real(short aligned) const;
};

/// Writes the fields in one line, "NBITS=8 BINPT=3 Shift=8 ...", without a newline and in the
/// stream's number base.
MORVIK_API std::ostream& operator<<(std::ostream& os, const TNumberFormat& format);

#endif

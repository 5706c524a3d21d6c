// TNumberFormat: a signed fixed-point format and its derived limits.
#include "TNumberFormat.h"

#include <locale>
#include <ostream>
#include <sstream>

#include "Messages.h"
#include "Misc.h"
#include "rules/Formats.h"

using morvik::rules::shiftLeftWrap;
using morvik::rules::wrap16;

namespace {

TNumberFormat* refuse(const std::string& properties)
{
    morvik::messages::writeError("ERROR:TNumberFormat:Unexpected property string:", properties);
    return nullptr;
}

}  // namespace

TNumberFormat::TNumberFormat(std::uint32_t nbits, std::uint32_t binpt)
    : itsNBits(nbits),
      itsBinPt(binpt),
      itsShift(morvik::rules::alignmentOf(nbits)),
      itsScale(std::uint32_t{1} << (binpt & 31U)),
      itsMin(0),
      itsMax(0),
      itsMinQ(morvik::rules::smallestOf(nbits)),
      itsMaxQ(morvik::rules::largestOf(nbits)),
      itsMask(0)
{
    itsMin = wrap16(shiftLeftWrap(wrap16(itsMinQ), itsShift));
    itsMax = wrap16(shiftLeftWrap(wrap16(itsMaxQ), itsShift));
    itsMask = static_cast<short>(itsMax | itsMin);
}

TNumberFormat* TNumberFormat::create(const std::string& properties)
{
    const auto [type, numbers] = splitString(properties, "_");
    if (type != "Fix") {
        return refuse(properties);
    }
    std::istringstream text(numbers);
    text.imbue(std::locale::classic());
    std::uint32_t nbits = 0;
    char separator = 0;
    std::uint32_t binpt = 0;
    text >> nbits >> separator >> binpt;
    if (text.fail() || separator != '_') {
        return refuse(properties);
    }
    if (nbits < 1 || nbits > 16) {
        morvik::messages::writeError("ERROR:TNumberFormat:nbits must be in range [1:16]");
        return nullptr;
    }
    if (binpt < 1 || binpt > 16 || binpt >= nbits) {
        morvik::messages::writeError("ERROR:TNumberFormat:binpt must be in range [1:16] and <nbits");
        return nullptr;
    }
    return new TNumberFormat(nbits, binpt);
}

std::string TNumberFormat::getProperties() const
{
    return "Fix_" + std::to_string(itsNBits) + "_" + std::to_string(itsBinPt);
}

short TNumberFormat::place(std::int32_t q) const
{
    if (q < itsMinQ) {
        return itsMin;
    }
    if (q > itsMaxQ) {
        return itsMax;
    }
    return wrap16(shiftLeftWrap(q, itsShift));
}

std::int32_t TNumberFormat::integer(short aligned) const
{
    return morvik::rules::integerOf(aligned, itsShift);
}

long double TNumberFormat::real(short aligned) const
{
    return static_cast<long double>(integer(aligned)) / itsScale;
}

std::ostream& operator<<(std::ostream& os, const TNumberFormat& format)
{
    return os << "NBITS=" << format.itsNBits << " BINPT=" << format.itsBinPt << " Shift=" << format.itsShift
              << " Scale=" << format.itsScale << " Min=" << format.itsMin << " Max=" << format.itsMax
              << " MinQ=" << format.itsMinQ << " MaxQ=" << format.itsMaxQ << " Mask=" << format.itsMask;
}

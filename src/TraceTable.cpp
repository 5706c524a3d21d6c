// TraceTable: rows of a trace, one for each trellis step.
#include "TraceTable.h"

#include <iomanip>
#include <locale>

TraceRow::TraceRow(const TNumberFormat& format) : itsFormat(format)
{
    itsText.imbue(std::locale::classic());
    itsText.exceptions(std::ios::badbit);  // exhausted memory throws instead of losing a row silently
    itsText << std::left << std::showpos << std::fixed << std::setprecision(6);
}

void TraceRow::begin(unsigned step)
{
    itsText.str({});
    itsText << std::setw(5) << step;
}

void TraceRow::value(short aligned)
{
    itsText << std::setw(12) << itsFormat.real(aligned);
}

void TraceRow::values(const T8& column, unsigned first, unsigned last)
{
    for (unsigned i = first; i <= last; ++i) {
        value(column[i]);
    }
}

void TraceRow::compared(short aligned, short other)
{
    itsText << (aligned == other ? ' ' : '*');
    value(aligned);
}

void TraceRow::compared(const T8& column, const T8& other, unsigned first, unsigned last)
{
    for (unsigned i = first; i <= last; ++i) {
        compared(column[i], other[i]);
    }
}

void TraceRow::gap()
{
    itsText << "  ";
}

void TraceRow::end(std::ostream& out)
{
    const std::string row = itsText.str();
    out.write(row.data(), static_cast<std::streamsize>(row.size()));
    out.put('\n');
}

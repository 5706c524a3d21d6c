// TraceTable: rows of a trace, one for each trellis step.
#ifndef MORVIK_SRC_TRACETABLE_H
#define MORVIK_SRC_TRACETABLE_H

#include <sstream>

#include "T8.h"
#include "TNumberFormat.h"

/// Composes a row and writes it. Steps take a field of 5 characters, values one of 12, both
/// left-aligned; a value is a real number with a sign and 6 decimals.
class TraceRow {
public:
    explicit TraceRow(const TNumberFormat& format);

    /// Begins a new row.
    void begin(unsigned step);

    void value(short aligned);

    /// Elements first to last of a column.
    void values(const T8& column, unsigned first, unsigned last);

    /// A value with a mark before it: "*" when `other`, which it is compared with, differs.
    void compared(short aligned, short other);

    /// Elements first to last of a column, each compared with the same element of another.
    void compared(const T8& column, const T8& other, unsigned first, unsigned last);

    /// Two blanks between groups of values.
    void gap();

    /// Writes the row and a newline.
    void end(std::ostream& out);

private:
    const TNumberFormat& itsFormat;
    std::ostringstream itsText;
};

#endif

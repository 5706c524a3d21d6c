// TraceTable: the rows of a trace, one for each trellis step.
#ifndef MORVIK_SRC_TRACETABLE_H
#define MORVIK_SRC_TRACETABLE_H

#include <sstream>

#include "T8.h"
#include "TNumberFormat.h"

/// Composes a row and writes it. The step's field is 5 characters wide, those of values 12, both
/// left-aligned; values are real numbers with a sign and 6 decimals.
class TraceRow {
public:
    explicit TraceRow(const TNumberFormat& format);

    /// Begins a new row.
    void begin(unsigned step);

    void value(short aligned);

    /// Elements first to last of a column.
    void values(const T8& column, unsigned first, unsigned last);

    /// A value, preceded by "*" if it differs from `other`.
    void compared(short aligned, short other);

    /// Elements first to last of a column, each compared with that of another column.
    void compared(const T8& column, const T8& other, unsigned first, unsigned last);

    /// Adds two blanks, between groups of values.
    void gap();

    /// Writes the row and a newline.
    void end(std::ostream& out);

private:
    const TNumberFormat& itsFormat;
    std::ostringstream itsText;
};

#endif

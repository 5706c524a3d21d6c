// T8: one trellis column, eight 16-bit metrics.
#ifndef MORVIK_SRC_T8_H
#define MORVIK_SRC_T8_H

/// One column of the trellis: element s belongs to trellis state s, 0 to 7. A column of branch
/// metrics uses elements 0 to 3 and leaves 4 to 7 unchanged. Arrays of columns are contiguous, one
/// column for each trellis step.
struct T8 {
    short metric[8];

    short& operator[](unsigned state)
    {
        return metric[state];
    }

    short operator[](unsigned state) const
    {
        return metric[state];
    }
};

/// Whether the first `count` elements of two columns are equal.
inline bool compareElements(const T8& a, const T8& b, unsigned count)
{
    for (unsigned i = 0; i < count; ++i) {
        if (a[i] != b[i]) {
            return false;
        }
    }
    return true;
}

/// Whether two columns of branch metrics are equal: elements 0 to 3.
inline bool compareT8_4(const T8& a, const T8& b)
{
    return compareElements(a, b, 4);
}

/// Whether two columns of state metrics are equal: elements 0 to 7.
inline bool compareT8(const T8& a, const T8& b)
{
    return compareElements(a, b, 8);
}

#endif

// Precise: numbers of twice the precision of a double, the same on every machine.
//
// Each is the sum of two doubles, computed by single operations of IEEE 754 (T. J. Dekker, "A floating-point technique
// for extending the available precision", 1971). Machines differ in `long double`, and mathematical libraries in how
// they round.
#ifndef MORVIK_LINK_CHANNEL_PRECISE_H
#define MORVIK_LINK_CHANNEL_PRECISE_H

#include <cmath>
#include <cstdint>

namespace morvik::link {

/// Results are off by some 2^-100 of their size, those of functions by some 2^-60. Magnitudes from 2^-900 to 2^900,
/// and 0.
class Precise {
public:
    constexpr Precise(double high, double low = 0) : itsHigh(high), itsLow(low) {}

    explicit constexpr operator double() const
    {
        return itsHigh;
    }

    /// The nearest integer of a number from 0 to 2^53; halves are rounded up.
    std::uint64_t rounded() const
    {
        const double whole = std::floor(itsHigh);
        const double rest = itsHigh - whole;
        return static_cast<std::uint64_t>(whole) + (rest > 0.5 || (rest == 0.5 && itsLow >= 0) ? 1 : 0);
    }

    friend constexpr Precise operator-(const Precise& a)
    {
        return {-a.itsHigh, -a.itsLow};
    }

    friend constexpr Precise operator+(const Precise& a, const Precise& b)
    {
        const Precise high = sum(a.itsHigh, b.itsHigh);
        const Precise low = sum(a.itsLow, b.itsLow);
        const Precise most = ordered(high.itsHigh, high.itsLow + low.itsHigh);
        return ordered(most.itsHigh, most.itsLow + low.itsLow);
    }

    friend constexpr Precise operator-(const Precise& a, const Precise& b)
    {
        return a + -b;
    }

    friend constexpr Precise operator*(const Precise& a, const Precise& b)
    {
        const Precise high = product(a.itsHigh, b.itsHigh);
        return ordered(high.itsHigh, high.itsLow + (a.itsHigh * b.itsLow + a.itsLow * b.itsHigh));
    }

    friend constexpr Precise operator/(const Precise& a, const Precise& b)
    {
        const double first = a.itsHigh / b.itsHigh;
        const Precise rest = a - b * first;
        const double second = rest.itsHigh / b.itsHigh;
        return Precise(ordered(first, second)) + (rest - b * second).itsHigh / b.itsHigh;
    }

    friend constexpr Precise operator/(const Precise& a, double b)
    {
        const double first = a.itsHigh / b;
        const Precise exact = product(first, b);
        return ordered(first, ((a.itsHigh - exact.itsHigh) - exact.itsLow + a.itsLow) / b);
    }

private:
    /// The exact sum; of ordered numbers, |a| >= |b|.
    static constexpr Precise ordered(double a, double b)
    {
        const double high = a + b;
        return {high, b - (high - a)};
    }

    static constexpr Precise sum(double a, double b)
    {
        const double high = a + b;
        const double ofB = high - a;
        return {high, (a - (high - ofB)) + (b - ofB)};
    }

    /// Of 53 bits, the upper 26; the product of two halves is exact.
    static constexpr double upperHalf(double a)
    {
        const double shifted = 0x8000001 * a;
        return shifted - (shifted - a);
    }

    /// The exact product.
    static constexpr Precise product(double a, double b)
    {
        const double high = a * b;
        const double upperA = upperHalf(a);
        const double upperB = upperHalf(b);
        const double lowerA = a - upperA;
        const double lowerB = b - upperB;
        return {high, ((upperA * upperB - high) + upperA * lowerB + lowerA * upperB) + lowerA * lowerB};
    }

    double itsHigh;
    double itsLow;  ///< at most half of the last bit of the high one
};

/// The root of a number above 0.
Precise squareRoot(const Precise& a);

/// e^a, for a from -700 to 600.
Precise exponential(const Precise& a);

/// The probability that a standard Gaussian variable is greater than x, from 0 to 37.
Precise upperTail(const Precise& x);

}  // namespace morvik::link

#endif

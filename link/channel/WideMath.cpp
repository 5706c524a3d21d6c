// WideMath: functions of the mathematical library in long double, with more bits than a double has on every machine.
#include "WideMath.h"

#include <cfloat>
#include <cmath>

namespace morvik::link {

namespace series {

namespace {

constexpr long double ln2 = 0.693147180559945309417232121458176568L;
constexpr long double ln10 = 2.302585092994045684017991454684364208L;
constexpr long double rootOfPi = 1.772453850905516027298167483341145183L;

/// e^x - 1 for |x| up to 0.35, by Taylor's series: term 30 is below 2^-150.
long double smallExponential(long double x)
{
    long double sum = 0;
    for (int n = 30; n > 0; --n) {
        sum = (1 + sum) * x / n;
    }
    return sum;
}

/// 1 - erfc(x) for x from 0 to 3: all terms are positive, and the last one is below 2^-130 of the sum.
long double erf(long double x)
{
    long double term = x;
    long double sum = x;
    for (int n = 1; n < 110; ++n) {
        term *= 2 * x * x / (2 * n + 1);
        sum += term;
    }
    return 2 / rootOfPi * exponential(-x * x) * sum;
}

/// erfc(x) for x of 3 or more, by Laplace's continued fraction: what is left out is below 2^-120 of the result.
long double tailErfc(long double x)
{
    long double denominator = x;
    for (int n = 120; n > 0; --n) {
        denominator = x + 0.5L * n / denominator;
    }
    return exponential(-x * x) / (rootOfPi * denominator);
}

}  // namespace

long double exponential(long double x)
{
    const long double halvings = std::round(x / ln2);
    return std::ldexp(1 + smallExponential(x - halvings * ln2), static_cast<int>(halvings));
}

long double erfc(long double x)
{
    if (x < 0) {
        return 2 - erfc(-x);
    }
    return x < 3 ? 1 - erf(x) : tailErfc(x);
}

long double powerOfTen(long double x)
{
    return exponential(x * ln10);
}

}  // namespace series

#if LDBL_MANT_DIG > 64 && !defined(__GLIBC__)

long double wideErfc(long double x)
{
    // Far out, where nothing is left of either tail.
    return std::fabs(x) < 100 ? series::erfc(x) : x < 0 ? 2 : 0;
}

long double widePowerOfTen(long double x)
{
    return series::powerOfTen(x);
}

#else

long double wideErfc(long double x)
{
    return std::erfc(x);
}

long double widePowerOfTen(long double x)
{
    return std::pow(10.0L, x);
}

#endif

}  // namespace morvik::link

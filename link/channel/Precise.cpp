// Precise: functions of numbers of twice the precision of a double.
#include "Precise.h"

#include <cmath>

namespace morvik::link {

Precise squareRoot(const Precise& a)
{
    // A step of Newton's method doubles the digits.
    const Precise root = std::sqrt(static_cast<double>(a));
    return root + (a - root * root) / (root * 2);
}

Precise exponential(const Precise& a)
{
    constexpr Precise ln2 = {0.6931471805599453, 2.3190468138462996e-17};
    const double doublings = std::nearbyint(static_cast<double>(a) / static_cast<double>(ln2));
    const Precise rest = a - ln2 * doublings;  // within ln 2 / 2, so that 18 terms are enough
    Precise sum = 1;
    for (int n = 18; n > 0; --n) {
        sum = sum * rest / n + 1;
    }
    return sum * std::ldexp(1.0, static_cast<int>(doublings));
}

Precise upperTail(const Precise& x)
{
    constexpr Precise largest = {0.3989422804014327, -2.49232720227773e-17};  // 1 / sqrt(2 pi), the density at 0
    const Precise square = x * x;
    const Precise density = largest * exponential(square * -0.5);
    // Below, a series whose terms are all positive; beyond, a continued fraction, which converges there.
    constexpr double border = 4.25;
    if (static_cast<double>(x) < border) {
        Precise sum = x;
        Precise term = x;
        for (int n = 3; static_cast<double>(term) > static_cast<double>(sum) * 0x1p-72; n += 2) {
            term = term * square / n;
            sum = sum + term;
        }
        return Precise(0.5) - density * sum;
    }
    Precise fraction = x;
    for (int n = 40; n > 0; --n) {
        fraction = x + Precise(n) / fraction;
    }
    return density / fraction;
}

}  // namespace morvik::link

// WideMath: functions of the mathematical library in long double, with more bits than a double has on every machine.
//
// The probabilities of the channel are rounded to multiples of 2^-48, which a double's 53 bits do not decide. glibc and
// the x87 unit compute in 64 bits or more. The library of WebAssembly (musl) has a long double of 113 bits, but
// computes these functions in double: there, the series below stand in. One point of two thousand then has a
// probability that the x87 unit rounds to the neighbouring multiple, which decides one soft value of some 10^14.
#ifndef MORVIK_LINK_CHANNEL_WIDEMATH_H
#define MORVIK_LINK_CHANNEL_WIDEMATH_H

namespace morvik::link {

/// The complementary error function.
long double wideErfc(long double x);

/// 10^x.
long double widePowerOfTen(long double x);

namespace series {

/// The same by basic operations alone, to within some units of the last place; `x` from -10000 to 10000.
long double exponential(long double x);
long double erfc(long double x);
long double powerOfTen(long double x);

}  // namespace series

}  // namespace morvik::link

#endif

// Decibels: ratios of energies in thousandths of a decibel.
//
// Only basic operations on constants, so that every machine computes the same numbers.
#ifndef MORVIK_LINK_CHANNEL_DECIBELS_H
#define MORVIK_LINK_CHANNEL_DECIBELS_H

namespace morvik::link {

/// The largest absolute value of a signal-to-noise ratio, in thousandths of a decibel.
constexpr int mostMilliDecibels = 262143;

/// 10^(milliDecibels / 10000), within four units in the last place, for -3000 to 3000 dB.
double ratioOf(int milliDecibels);

/// The inverse for ratios above 0, rounded to thousandths of a decibel.
int milliDecibelsOf(double ratio);

}  // namespace morvik::link

#endif

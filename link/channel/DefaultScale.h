// DefaultScale: the default scale: the soft value for amplitude 1.
#ifndef MORVIK_LINK_CHANNEL_DEFAULTSCALE_H
#define MORVIK_LINK_CHANNEL_DEFAULTSCALE_H

namespace morvik::link {

/// Types 0 and 1 do not depend on the noise variance: amplitude 1 is the number 1, which is 8 eighths. The correction
/// of type 2 is right for soft values of half the log-likelihood ratio: amplitude 1 is 1 / variance. docs/scale.md
/// shows what other scales cost.
///
/// K                one of the 188 block sizes
/// milliDecibels    Eb/N0 in thousandths of a decibel
double defaultScale(int algorithmType, unsigned K, int milliDecibels);

}  // namespace morvik::link

#endif

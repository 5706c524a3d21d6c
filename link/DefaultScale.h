// DefaultScale: how many steps of a soft value amplitude 1 takes when nobody says otherwise.
#ifndef MORVIK_LINK_DEFAULTSCALE_H
#define MORVIK_LINK_DEFAULTSCALE_H

namespace morvik::link {

/// Types 0 and 1 do without the noise's variance: amplitude 1 is the number 1, which is 8 steps. Type 2 corrects its
/// maxima for soft values of the right scale, half the log-likelihood ratio: amplitude 1 is 1 / variance. The section
/// "Scale" of docs/error_rates.md shows what other scales cost.
///
/// K                one of the 188 block sizes
/// milliDecibels    Eb/N0 in thousandths of a decibel
double defaultScale(int algorithmType, unsigned K, int milliDecibels);

}  // namespace morvik::link

#endif

// DefaultScale: the default scale: the soft value for amplitude 1.
#include "DefaultScale.h"

#include "Channel.h"

namespace morvik::link {

double defaultScale(int algorithmType, unsigned K, int milliDecibels)
{
    constexpr double one = 8;  // steps, in the format of the soft inputs
    if (algorithmType < 2) {
        return one;
    }
    // A soft value s adds +s to a metric for a bit 1 and -s for a bit 0, so the logarithms of their probabilities
    // differ by 2 s. For a received value y and noise of variance v they differ by 2 y / v.
    const Precise deviation = noiseDeviation(K, milliDecibels);
    return static_cast<double>(Precise(one) / (deviation * deviation));
}

}  // namespace morvik::link

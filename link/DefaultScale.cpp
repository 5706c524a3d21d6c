// DefaultScale: how many steps of a soft value amplitude 1 takes when nobody says otherwise.
#include "DefaultScale.h"

#include "Channel.h"

namespace morvik::link {

double defaultScale(int algorithmType, unsigned K, int milliDecibels)
{
    constexpr double one = 8;  // steps, in the format of the soft inputs
    if (algorithmType < 2) {
        return one;
    }
    // A metric counts a soft value s as +s for a bit 1 and as -s for a bit 0, so the logarithms of their probabilities
    // differ by 2 s. With noise of variance v, they differ by 2 y / v for what is received, y.
    const long double deviation = noiseDeviation(K, milliDecibels);
    return static_cast<double>(one / (deviation * deviation));
}

}  // namespace morvik::link

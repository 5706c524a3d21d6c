// DefaultScale: how many steps of a soft value amplitude 1 takes when nobody says otherwise.
#include "DefaultScale.h"

#include "Channel.h"

namespace morvik::link {

double defaultScale(int algorithmType, unsigned K, int milliDecibels)
{
    if (algorithmType < 2) {
        return 8;
    }
    const long double deviation = noiseDeviation(K, milliDecibels);
    return static_cast<double>(8 / (deviation * deviation));
}

}  // namespace morvik::link

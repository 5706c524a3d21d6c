// DefaultScale: how many steps of a soft value amplitude 1 takes when nobody says otherwise.
#ifndef MORVIK_LINK_DEFAULTSCALE_H
#define MORVIK_LINK_DEFAULTSCALE_H

namespace morvik::link {

double defaultScale(int algorithmType, unsigned K, int milliDecibels);

}  // namespace morvik::link

#endif

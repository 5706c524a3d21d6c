// LinkWords: how blocks are sent and received, in words for tables, legends and messages.
#ifndef MORVIK_SIMULATION_LINKWORDS_H
#define MORVIK_SIMULATION_LINKWORDS_H

#include <string>

#include "Point.h"

namespace morvik::simulation {

/// What is sent: "K = 512", "K = 512, 16qam", "MCS 64qam 10, A = 7992, G = 24000, 16qam".
std::string sentText(const Point& point);

/// The same for a legend: of an MCS, its index alone.
std::string shortSentText(const Point& point);

/// How it is received, as far as that is not what is usual, each part after ", ".
std::string receivedText(const LinkFormat& link);

/// A curve: "K = 512, 2 units, scaled, scale auto, 8 iterations".
std::string curveText(const Point& point);

/// Where a point of it is: "Eb/N0 1.2 dB".
std::string placeText(const Point& point);

}  // namespace morvik::simulation

#endif

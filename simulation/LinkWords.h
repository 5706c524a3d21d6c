// LinkWords: how blocks are sent and received, in words for tables and legends.
#ifndef MORVIK_APP_BER_LINKWORDS_H
#define MORVIK_APP_BER_LINKWORDS_H

#include <string>

#include "simulation/Point.h"

namespace morvik {

/// What is sent: "K = 512", "K = 512, 16qam", "MCS 64qam 10, A = 7992, G = 24000, 16qam".
std::string sentText(const simulation::Point& point);

/// The same for a legend: of an MCS, its index alone.
std::string shortSentText(const simulation::Point& point);

/// How it is received, as far as that is not what is usual, each part after ", ".
std::string receivedText(const simulation::LinkFormat& link);

}  // namespace morvik

#endif

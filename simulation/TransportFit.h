// TransportFit: whether a transport block can be sent as options ask for, and what would fit.
#ifndef MORVIK_SIMULATION_TRANSPORTFIT_H
#define MORVIK_SIMULATION_TRANSPORTFIT_H

#include <cstdint>
#include <string>

#include "link/modulation/Modulation.h"

namespace morvik::simulation {

/// Coded bits of a transmission, for options: four for each bit of the largest transport block, and few enough for a
/// row of them.
constexpr std::uint32_t mostCodedBits = 1U << 26;

/// What is sent, as options say it.
struct TransportChoice {
    unsigned bits = 0;  ///< of the transport block (A)
    unsigned codedBits = 0;
    link::Modulation modulation = link::Modulation::qpsk;
    unsigned softBufferSize = 0;  ///< 0: not limited
};

/// Throws base::Error unless the transport block can be sent: with the options that do not go together, and what would.
/// `block` names the transport block: "--transport-block-size 100".
void checkFit(const TransportChoice& choice, const std::string& block);

}  // namespace morvik::simulation

#endif

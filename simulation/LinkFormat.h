// LinkFormat: how blocks reach the decoder.
#ifndef MORVIK_SIMULATION_LINKFORMAT_H
#define MORVIK_SIMULATION_LINKFORMAT_H

#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "link/channel/FadingChannel.h"
#include "link/modulation/Demapper.h"
#include "link/modulation/Modulation.h"
#include "link/tables/TransportBlockSizes.h"

namespace morvik::simulation {

/// A row of the tables of 3GPP TS 36.213.
struct McsIndex {
    link::McsTable table = link::McsTable::qam64;
    unsigned index = 0;
};

/// The most transmissions of a transport block.
constexpr std::size_t mostTransmissions = 16;

/// Defaults: plain code blocks over BPSK and white Gaussian noise.
struct LinkFormat {
    unsigned transportBlockSize = 0;   // without its CRC (A); 0: plain code blocks
    unsigned codedBits = 0;            // of one transmission (G); 0 for plain code blocks
    std::optional<McsIndex> mcs = {};  // from which they follow
    link::Modulation modulation = link::Modulation::bpsk;
    link::Fading fading = link::Fading::none;
    link::Demapper demapper = link::Demapper::maxLog;
    std::vector<unsigned> versions = {};  // the redundancy version of each transmission; none of plain code blocks
    unsigned softBufferBits = 0;          // 0: full width
    unsigned softBufferSize = 0;          // N_IR; 0: unlimited
    bool stopsEarly = false;              // with the first iteration whose CRC fits

    bool hasTransportBlocks() const
    {
        return transportBlockSize > 0;
    }

    /// Plain code blocks over BPSK and white Gaussian noise.
    bool isPlainBpsk() const
    {
        return !hasTransportBlocks() && modulation == link::Modulation::bpsk && fading == link::Fading::none;
    }
};

bool operator==(const LinkFormat& a, const LinkFormat& b);
bool operator<(const LinkFormat& a, const LinkFormat& b);

/// "64qam 5", "256qam 27"; empty without an MCS.
std::string mcsText(const std::optional<McsIndex>& mcs);

/// The names of the tables: 64qam, 256qam.
std::string_view nameOf(link::McsTable table);
std::optional<link::McsTable> mcsTableOf(std::string_view name);

/// The numbers, separated by `separator`.
std::string versionsText(const std::vector<unsigned>& versions, char separator);

}  // namespace morvik::simulation

#endif

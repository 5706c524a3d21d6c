// TransportCheck: compares decisions with the code blocks that were sent, and checks their CRCs.
#ifndef MORVIK_SIMULATION_TRANSPORTCHECK_H
#define MORVIK_SIMULATION_TRANSPORTCHECK_H

#include <cstdint>
#include <utility>
#include <vector>

#include "link/TransportSource.h"
#include "link/coding/Crc.h"

namespace morvik::simulation {

/// The errors in the decisions on a code block. Filler bits are known, so decisions on them do not count.
struct BlockVerdict {
    std::uint32_t wrongBits = 0;
    bool fits = false;  // its CRC: that of the transport block, if it is alone
};

class TransportCheck {
public:
    /// The source must outlive the check.
    explicit TransportCheck(const link::TransportSource& source);

    /// Begins with `count` frames that the source has begun with.
    void begin(unsigned count);

    /// Judges K decisions on code block r of a frame.
    BlockVerdict check(unsigned frame, unsigned r, const std::uint8_t* decided);

    /// Whether the transport block's CRC fits if all of a frame's code blocks are right but these: pairs of r and the
    /// decisions on it.
    using Decisions = std::pair<unsigned, std::vector<std::uint8_t>>;
    bool fits(unsigned frame, const std::vector<Decisions>& others) const;

    /// Whether the CRC of code block r can fit although so many of its decisions are wrong, filler bits included. Where
    /// it cannot, all of them are outside of those.
    bool canMiss(unsigned r, std::uint32_t wrongBits) const
    {
        return wrongBits > 0 && (itsSource.code().blocks().fillersOf(r) > 0 || link::crcCanMiss(wrongBits));
    }

    /// The bits of code block r, filler bits and CRC included: K bytes.
    void sentBits(unsigned frame, unsigned r, std::uint8_t* bits) const;
    std::vector<std::uint8_t> sentBits(unsigned frame, unsigned r) const;

private:
    const std::uint64_t* sent(unsigned frame, unsigned r) const
    {
        return &itsSent[frame * itsWords.back() + itsWords[r]];
    }

    const link::TransportSource& itsSource;
    std::vector<std::size_t> itsWords;  // before each code block of a frame
    std::vector<std::uint64_t> itsSent;
    std::vector<std::uint64_t> itsDecided;
};

}  // namespace morvik::simulation

#endif

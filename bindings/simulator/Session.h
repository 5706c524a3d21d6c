// Session: a decoder for a simulator's test bench: filled value by value, read bit by bit, its messages queued.
//
// Bindings for simulators whose interfaces disagree on arrays are thin layers over it.
#ifndef MORVIK_BINDINGS_SIMULATOR_SESSION_H
#define MORVIK_BINDINGS_SIMULATOR_SESSION_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <deque>
#include <string>
#include <vector>

#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik::simulator {

/// Writes nothing to the standard streams. They are process-wide, so the calls of all sessions take turns.
class Session {
public:
    /// If the generics are refused, the decoder is not `open`, and a message says why.
    Session(int numPu, int algorithm, int tagWidth);
    ~Session();
    Session(const Session&) = delete;
    Session& operator=(const Session&) = delete;

    bool open() const
    {
        return itsState != nullptr;
    }

    /// Appends a position to the next block.
    void put(int sys, int par1, int par2) noexcept;

    /// Decodes the positions put since the last call, K + 4, and clears them. Returns the status of the C interface, 0
    /// when decoded. Throws std::bad_alloc if memory runs out outside of it.
    int decode(int iterations, std::uint32_t tag);

    /// The decisions of the last decode, none if it was refused.
    const std::vector<std::uint8_t>& bits() const
    {
        return itsBits;
    }

    std::uint32_t tag() const
    {
        return itsTag;
    }

    /// Takes the oldest line from the message queue: "ERROR:..." or "WARNING:...", or an empty string if there is none.
    /// The string is valid until the next call.
    const std::string& nextMessage();

private:
    int simulate(std::size_t positions, int iterations, std::uint32_t tag);
    void queue(const std::string& lines);

    veltra_ip_morvik_v1_0_state* itsState = nullptr;
    std::array<std::vector<std::int32_t>, 3> itsStreams;
    std::size_t itsPositions = 0;  ///< positions put, also beyond what the streams hold
    std::vector<std::uint8_t> itsBits;
    std::uint32_t itsTag = 0;
    std::deque<std::string> itsMessages;
    std::string itsMessage;
};

}  // namespace morvik::simulator

#endif

// morvik_vhdl: the C functions that morvik_pkg.vhd declares as foreign.
//
// All simulators pass 32-bit integers alike, so a decoder is a number, and a message is read character by character.
// Every function ignores an unknown number. No exception passes into the simulator. A simulation runs in one thread.
#include <cstddef>
#include <cstdint>
#include <exception>
#include <map>
#include <string>

#include "bindings/simulator/Session.h"

namespace {

using morvik::simulator::Session;

/// Decoders by number. They live to the end of the simulation unless destroyed.
std::map<std::int32_t, Session>& sessions()
{
    static std::map<std::int32_t, Session> all;
    return all;
}

Session* find(std::int32_t decoder)
{
    const auto found = sessions().find(decoder);
    return found == sessions().end() ? nullptr : &found->second;
}

/// The last message taken.
std::string& taken()
{
    static std::string message;
    return message;
}

/// Only memory can fail in a session.
constexpr std::int32_t outOfMemory = 99;

}  // namespace

extern "C" {

/// A number from 1 that no other decoder has had, or 0 if memory is exhausted. Refused generics leave a decoder that is
/// not open, whose message says why.
MORVIK_API std::int32_t morvik_vhdl_create(std::int32_t numPu, std::int32_t algorithm, std::int32_t tagWidth)
{
    static std::int32_t last = 0;
    try {
        sessions().try_emplace(last + 1, numPu, algorithm, tagWidth);
        return ++last;
    } catch (const std::exception&) {
        return 0;
    }
}

MORVIK_API void morvik_vhdl_destroy(std::int32_t decoder)
{
    sessions().erase(decoder);
}

/// 1 if the number is that of a decoder whose generics were accepted, else 0.
MORVIK_API std::int32_t morvik_vhdl_is_open(std::int32_t decoder)
{
    const Session* const session = find(decoder);
    return session != nullptr && session->open() ? 1 : 0;
}

/// Appends a position to the next block.
MORVIK_API void morvik_vhdl_put(std::int32_t decoder, std::int32_t sys, std::int32_t par1, std::int32_t par2)
{
    if (Session* const session = find(decoder)) {
        session->put(sys, par1, par2);
    }
}

/// Decodes the positions put since the last call, and clears them. Returns the status of the C interface.
MORVIK_API std::int32_t morvik_vhdl_decode(std::int32_t decoder, std::int32_t iterations, std::int32_t tag)
{
    Session* const session = find(decoder);
    if (session == nullptr) {
        return 1;
    }
    try {
        return session->decode(iterations, static_cast<std::uint32_t>(tag));
    } catch (const std::exception&) {
        return outOfMemory;
    }
}

/// Results of the last decode: a decision, and the tag.
MORVIK_API std::int32_t morvik_vhdl_bit(std::int32_t decoder, std::int32_t position)
{
    const Session* const session = find(decoder);
    const auto index = static_cast<std::size_t>(position);
    return session != nullptr && index < session->bits().size() ? session->bits()[index] : 0;
}

MORVIK_API std::int32_t morvik_vhdl_tag(std::int32_t decoder)
{
    const Session* const session = find(decoder);
    return session == nullptr ? 0 : static_cast<std::int32_t>(session->tag());
}

/// Takes the oldest message of a decoder and returns its length, 0 if there is none; then its characters, from 1.
MORVIK_API std::int32_t morvik_vhdl_message(std::int32_t decoder)
{
    taken().clear();
    if (Session* const session = find(decoder)) {
        taken() = session->nextMessage();
    }
    return static_cast<std::int32_t>(taken().size());
}

MORVIK_API std::int32_t morvik_vhdl_character(std::int32_t position)
{
    const auto index = static_cast<std::size_t>(position) - 1;
    return index < taken().size() ? static_cast<unsigned char>(taken()[index]) : 0;
}

}  // extern "C"

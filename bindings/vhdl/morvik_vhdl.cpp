// morvik_vhdl: the C functions that morvik_pkg.vhd and morvik_checker_pkg.vhd declare as foreign.
//
// All simulators pass 32-bit integers alike, so a decoder or checker is a number, and a message is read character by
// character. Every function ignores an unknown number. No exception passes into the simulator. A simulation runs in one
// thread.
#include <array>
#include <cstddef>
#include <cstdint>
#include <exception>
#include <map>
#include <memory>
#include <string>

#include "bindings/simulator/Session.h"
#include "bindings/simulator/UnitCall.h"
#include "morvik_checker.h"

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

struct DestroyChecker {
    void operator()(morvik_checker* checker) const
    {
        morvik_checker_destroy(checker);
    }
};

using Checkers = std::map<std::int32_t, std::unique_ptr<morvik_checker, DestroyChecker>>;

/// Checkers by number, likewise.
Checkers& checkers()
{
    static Checkers all;
    return all;
}

/// Null for an unknown number, which the functions of morvik_checker.h take.
morvik_checker* findChecker(std::int32_t checker)
{
    const auto found = checkers().find(checker);
    return found == checkers().end() ? nullptr : found->second.get();
}

/// Calls of units.
morvik::simulator::UnitCall& unitCall()
{
    static morvik::simulator::UnitCall call;
    return call;
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

/// Keeps a text, whose characters are then read, and returns its length.
static std::int32_t take(const char* text)
{
    taken() = text;
    return static_cast<std::int32_t>(taken().size());
}

/// A number from 1 that no other checker has had, or 0 if memory is exhausted.
MORVIK_API std::int32_t morvik_vhdl_checker_create(std::int32_t numPu, std::int32_t algorithm)
{
    static std::int32_t last = 0;
    try {
        Checkers::mapped_type checker(morvik_checker_create(numPu, algorithm));
        if (!checker) {
            return 0;
        }
        checkers()[last + 1] = std::move(checker);
        return ++last;
    } catch (const std::exception&) {
        return 0;
    }
}

MORVIK_API void morvik_vhdl_checker_destroy(std::int32_t checker)
{
    checkers().erase(checker);
}

MORVIK_API std::int32_t morvik_vhdl_checker_is_open(std::int32_t checker)
{
    return morvik_checker_is_open(findChecker(checker));
}

MORVIK_API void morvik_vhdl_checker_put(std::int32_t checker, std::int32_t sys, std::int32_t par1, std::int32_t par2)
{
    morvik_checker_put(findChecker(checker), sys, par1, par2);
}

MORVIK_API void morvik_vhdl_checker_forget(std::int32_t checker)
{
    morvik_checker_forget(findChecker(checker));
}

MORVIK_API std::int32_t morvik_vhdl_checker_start(std::int32_t checker, std::int32_t iterations)
{
    return morvik_checker_start(findChecker(checker), iterations);
}

MORVIK_API std::int32_t morvik_vhdl_checker_observe(
    std::int32_t checker, std::int32_t signal, std::int32_t halfIteration, std::int32_t step, std::int32_t value)
{
    return morvik_checker_observe(findChecker(checker), signal, halfIteration, step, value);
}

/// The last four values of a row of four do not matter.
MORVIK_API std::int32_t morvik_vhdl_checker_observe_row(std::int32_t checker,
                                                        std::int32_t signal,
                                                        std::int32_t halfIteration,
                                                        std::int32_t step,
                                                        std::int32_t value0,
                                                        std::int32_t value1,
                                                        std::int32_t value2,
                                                        std::int32_t value3,
                                                        std::int32_t value4,
                                                        std::int32_t value5,
                                                        std::int32_t value6,
                                                        std::int32_t value7)
{
    const std::array<std::int32_t, 8> values = {value0, value1, value2, value3, value4, value5, value6, value7};
    return morvik_checker_observe_row(findChecker(checker), signal, halfIteration, step, values.data());
}

MORVIK_API std::int32_t morvik_vhdl_checker_value(std::int32_t checker,
                                                  std::int32_t signal,
                                                  std::int32_t halfIteration,
                                                  std::int32_t step)
{
    return morvik_checker_value(findChecker(checker), signal, halfIteration, step);
}

MORVIK_API std::int32_t morvik_vhdl_checker_ratio(std::int32_t checker, std::int32_t bit)
{
    return morvik_checker_ratio(findChecker(checker), bit);
}

MORVIK_API std::int32_t morvik_vhdl_checker_standing(std::int32_t checker)
{
    return morvik_checker_standing(findChecker(checker));
}

/// Takes the report, the counts of situations, or the oldest message, as morvik_vhdl_message does.
MORVIK_API std::int32_t morvik_vhdl_checker_report(std::int32_t checker)
{
    return take(morvik_checker_report(findChecker(checker)));
}

MORVIK_API std::int32_t morvik_vhdl_checker_count_situations(std::int32_t checker)
{
    return morvik_checker_count_situations(findChecker(checker));
}

MORVIK_API std::int32_t morvik_vhdl_checker_situations(std::int32_t checker)
{
    return take(morvik_checker_situations(findChecker(checker)));
}

MORVIK_API std::int32_t morvik_vhdl_checker_message(std::int32_t checker)
{
    return take(morvik_checker_message(findChecker(checker)));
}

/// Appends an input of the next unit.
MORVIK_API void morvik_vhdl_unit_put(std::int32_t value)
{
    unitCall().put(value);
}

/// Computes what a unit makes of the inputs, and forgets those. Returns the number of results, 0 if something was
/// refused.
MORVIK_API std::int32_t morvik_vhdl_unit_compute(std::int32_t unit, std::int32_t algorithm)
{
    return unitCall().compute(unit, algorithm);
}

MORVIK_API std::int32_t morvik_vhdl_unit_result(std::int32_t number)
{
    return unitCall().result(number);
}

/// Takes why the last call was refused, as morvik_vhdl_message does.
MORVIK_API std::int32_t morvik_vhdl_unit_message()
{
    return take(unitCall().message().c_str());
}

}  // extern "C"

// NameMap: what a dump calls its signals and how it writes numbers.
#ifndef MORVIK_HARDWARE_COMPARISON_NAMEMAP_H
#define MORVIK_HARDWARE_COMPARISON_NAMEMAP_H

#include <array>
#include <cstdint>
#include <istream>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <string_view>

#include "hardware/testbench/Passes.h"

namespace morvik::comparison {

/// How numbers are written.
enum class NumberForm : std::uint8_t {
    automatic,        ///< real with a point, hexadecimal behind 0x, else integer
    integer,          ///< decimal, in eighths
    unsignedInteger,  ///< decimal, the bits of two's complement
    real,
    hexadecimal,  ///< the digits of two's complement
    binary,
};

/// Read from a JSON object, whose keys may all be left out:
///   "columns"   of CSV, or, the first two, variables of VCD: {"half_iteration": NAME, "step": NAME, "signal": NAME,
///               "value": NAME}
///   "signals"   {NAME: SIGNAL or null, ...}: SIGNAL is one of passSignals, or a list of two that are always equal;
///               null leaves the signal out
///   "numbers"   auto, integer, unsigned, real, hex or binary
///   "bits"      of a number in two's complement, 12 when left out; or {SIGNAL: bits, ...}
///   "first_half_iteration", "first_step"   what the dump counts from, 0 when left out
///   "valid"     of VCD: a variable that is 1 when the values of its scope count
struct NameMap {
    /// What a dump has instead of one of the signals.
    static constexpr unsigned leftOut = ~0U;

    std::string passColumn = "half_iteration";
    std::string stepColumn = "step";
    std::string signalColumn = "signal";
    std::string valueColumn = "value";
    std::map<std::string, unsigned, std::less<>> signals;  ///< to places in passSignals, or leftOut
    std::set<std::string, std::less<>> needed;             ///< names of signals that a dump has to have
    bool namesRows = false;                                ///< whether it names the column of signals or of values
    std::array<std::string, passSignals.size()> standIns;  ///< names that stand for these signals, too
    NumberForm numbers = NumberForm::automatic;
    std::array<unsigned, passSignals.size()> bits;
    unsigned firstPass = 0;
    unsigned firstStep = 0;
    std::string valid;

    /// Without a file: the names of passSignals.
    NameMap();

    /// The signal that a dump calls so.
    std::optional<unsigned> signal(std::string_view name) const;

    /// The value in eighths that a text stands for as one of the signal; nothing when it is no number of the form. It
    /// may be out of range.
    std::optional<std::int64_t> number(std::string_view text, unsigned signal) const;

    /// What number() expects, for messages.
    std::string expectedNumber(unsigned signal) const;
};

/// Throws a base::Error that opens with the file.
NameMap readNameMap(std::istream& input, const std::string& name);

}  // namespace morvik::comparison

#endif

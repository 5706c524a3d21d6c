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

/// The form of numbers.
enum class NumberForm : std::uint8_t {
    automatic,        ///< real with a point, hexadecimal after 0x, else integer
    integer,          ///< decimal, in eighths
    unsignedInteger,  ///< decimal, two's complement read as unsigned
    real,
    hexadecimal,  ///< two's complement
    binary,
};

/// Read from a JSON object, all keys of which are optional:
///   "columns"   of CSV, or, the first two, variables of VCD: {"half_iteration": NAME, "step": NAME, "signal": NAME,
///               "value": NAME}
///   "signals"   {NAME: SIGNAL or null, ...}: SIGNAL is one of passSignals, or a list of two that are always equal;
///               null ignores the signal
///   "numbers"   auto, integer, unsigned, real, hex or binary
///   "bits"      of a number in two's complement, default 12; or {SIGNAL: bits, ...}
///   "first_half_iteration", "first_step"   what the dump counts from, default 0
///   "valid"     of VCD: a variable that is 1 when the values of its scope are valid
struct NameMap {
    /// Stands for a name that the map ignores.
    static constexpr unsigned leftOut = ~0U;

    std::string passColumn = "half_iteration";
    std::string stepColumn = "step";
    std::string signalColumn = "signal";
    std::string valueColumn = "value";
    std::map<std::string, unsigned, std::less<>> signals;  ///< to indices in passSignals, or leftOut
    std::set<std::string, std::less<>> needed;             ///< names of signals that the dump must have
    bool namesRows = false;                                ///< whether the map names the signal or value column
    std::array<std::string, passSignals.size()> standIns;  ///< names that also stand for these signals
    NumberForm numbers = NumberForm::automatic;
    std::array<unsigned, passSignals.size()> bits;
    unsigned firstPass = 0;
    unsigned firstStep = 0;
    std::string valid;

    /// The default map: the names of passSignals.
    NameMap();

    /// The signal of a name in the dump.
    std::optional<unsigned> signal(std::string_view name) const;

    /// Parses a value of the signal into eighths; nothing if it is no number of the form. The result may be out of
    /// range.
    std::optional<std::int64_t> number(std::string_view text, unsigned signal) const;

    /// What number() expects, for messages.
    std::string expectedNumber(unsigned signal) const;
};

/// Reads a map. Throws base::Error, prefixed with the file's name.
NameMap readNameMap(std::istream& input, const std::string& name);

}  // namespace morvik::comparison

#endif

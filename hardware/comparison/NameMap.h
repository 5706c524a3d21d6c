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
#include <utility>
#include <vector>

#include "NamePattern.h"
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

/// Where and when values belong: names of columns of CSV or variables of VCD, and how late the values are.
struct Timing {
    std::string pass = "half_iteration";
    std::string step = "step";
    std::string valid;          ///< 1 when the values count; empty if they always do
    unsigned delay = 0;         ///< the values belong to the half-iteration and step named so long before
    bool countsClocks = false;  ///< whether the delay counts clocks, not steps

    bool operator==(const Timing& other) const
    {
        return pass == other.pass && step == other.step && valid == other.valid && delay == other.delay &&
               countsClocks == other.countsClocks;
    }
};

/// A signal in the values of a name. A packed vector has several.
struct Element {
    unsigned signal = 0;
    unsigned timing = 0;    ///< index in NameMap::timings
    unsigned lowest = 0;    ///< bit in the vector
    unsigned bits = 0;      ///< of the element; 0 if it is the whole value
    unsigned segments = 0;  ///< the value belongs to the same step of a later segment or unit
    unsigned units = 0;
};

/// Read from a JSON object, all keys of which are optional:
///   "columns"   of CSV, or variables of VCD except for signal and value: {"half_iteration": NAME, "step": NAME,
///               "signal": NAME, "value": NAME, "block": NAME}
///   "signals"   {NAME: SIGNAL or null, ...}: SIGNAL is one of passSignals, a list of two that are always equal, or an
///               object with "signal" or "packed" and what is particular to the name; or a list of objects. null
///               ignores the name. In NAME, * stands for any characters but points, and {WORD} for a number that
///               "{WORD}" in SIGNAL repeats.
///   "numbers"   auto, integer, unsigned, real, hex or binary
///   "bits"      of a number in two's complement, default 12; or {SIGNAL: bits, ...}
///   "first_half_iteration", "first_step", "first_block"   what the dump counts from, default 0
///   "valid"     a column or variable that is 1 when the values of its row or scope are valid
///   "clock"     of VCD: a variable whose rising edges count delays
///   "start"     of VCD: a variable whose rising edges begin the blocks, in place of their numbers
struct NameMap {
    /// A name that stands for many. The texts of the signals repeat its words.
    struct Pattern {
        NamePattern name;
        std::vector<std::pair<std::string, Element>> elements;
    };

    std::string signalColumn = "signal";
    std::string valueColumn = "value";
    std::string blockColumn = "block";
    std::vector<Timing> timings = {{}};                                ///< the first is that of the whole map
    std::map<std::string, std::vector<Element>, std::less<>> signals;  ///< without elements if left out
    std::vector<Pattern> patterns;              ///< count, the first that matches, where `signals` lacks the name
    std::set<std::string, std::less<>> needed;  ///< names and patterns that the dump must have
    bool namesRows = false;                     ///< whether the map names the signal or value column
    std::array<std::string, passSignals.size()> standIns;  ///< names that also stand for these signals
    NumberForm numbers = NumberForm::automatic;
    std::array<unsigned, passSignals.size()> bits;
    unsigned firstPass = 0;
    unsigned firstStep = 0;
    unsigned firstBlock = 0;
    std::string clock;
    std::string start;

    /// The default map: the names of passSignals.
    NameMap();

    /// What a name in the dump stands for.
    struct Found {
        std::string name;               ///< of the map: the name itself or a pattern
        std::vector<Element> elements;  ///< none if it is left out
    };

    std::optional<Found> find(std::string_view name) const;

    /// Parses a value of the signal into eighths; nothing if it is no number of the form. The result may be out of
    /// range.
    std::optional<std::int64_t> number(std::string_view text, unsigned signal) const;

    /// What number() expects, for messages.
    std::string expectedNumber(unsigned signal) const;

    /// The name of the map's signal that stands for a name of the map, for messages.
    std::string meaningOf(const std::string& name) const;
};

/// The signal of this name in the model.
std::optional<unsigned> signalCalled(std::string_view name);

/// Reads a map. Throws base::Error, prefixed with the file's name.
NameMap readNameMap(std::istream& input, const std::string& name);

}  // namespace morvik::comparison

#endif

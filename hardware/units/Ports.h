// Ports: the units by number and name, and the values that they take and give.
#ifndef MORVIK_HARDWARE_UNITS_PORTS_H
#define MORVIK_HARDWARE_UNITS_PORTS_H

#include <array>
#include <cstdint>
#include <optional>
#include <stdexcept>
#include <string>
#include <string_view>
#include <vector>

#include "rules/Formats.h"

namespace morvik::units {

/// What a value is. The order is that of the statuses of morvik_units.h.
enum class Kind : std::uint8_t { soft, apriori, twiceIntrinsic, branch, metric, pending, blockSize, step };

struct Range {
    const char* what;
    unsigned bits;
    std::int32_t lowest;
    std::int32_t highest;
};

/// The register of each kind, and what it can hold.
constexpr std::array<Range, 8> ranges = {
    {{"soft value", rules::inputBits, -128, 127},
     {"a-priori or extrinsic value", rules::branchBits, -128, 127},
     {"twice the intrinsic value", rules::branchBits + 1, -192, 190},  // half of -128 and -128; half of 127 and 127
     {"branch metric", rules::branchBits, -128, 127},
     {"metric or ratio", rules::stateBits, -2048, 2047},
     {"pending correction", 3, 0, 6},  // the greatest entry of the table, ln 2
     {"block size", 13, 40, 6144},
     {"step", 13, 0, 6143}}};

constexpr const Range& rangeOf(Kind kind)
{
    return ranges[static_cast<std::size_t>(kind)];
}

constexpr bool isSigned(Kind kind)
{
    return rangeOf(kind).lowest < 0;
}

/// One value, or a row of them.
struct Port {
    const char* name;
    Kind kind;
    unsigned count;
};

struct Unit {
    const char* name;
    std::vector<Port> inputs;
    std::vector<Port> outputs;
};

/// The numbers of the units, in the order of a pass.
enum class Number : std::uint8_t { intrinsic, branch, forward, backward, ratio, extrinsic, address, tail, border };

/// By their numbers.
const std::vector<Unit>& allUnits();

std::optional<Number> findUnit(std::string_view name);

/// How many values the ports have.
unsigned valuesOf(const std::vector<Port>& ports);

/// The name of a value: that of its port, with its place in a row.
std::string nameOf(const Port& port, unsigned index);

/// An input that is not allowed; what() tells it.
class BadInput : public std::invalid_argument {
public:
    using std::invalid_argument::invalid_argument;
};

/// Throws BadInput for an algorithm type other than 0 to 2.
void expectAlgorithm(int algorithm);

/// An input with bits that are x or z, which a register cannot tell.
constexpr std::int32_t unknownValue = INT32_MIN;

/// The values of the unit's outputs, port after port. Throws BadInput unless there is one value for each input, within
/// its range.
std::vector<std::int32_t> compute(Number unit, int algorithm, const std::vector<std::int32_t>& inputs);

}  // namespace morvik::units

#endif

// UnitCall: calls of the core's units for simulators, which pass values one by one.
#ifndef MORVIK_BINDINGS_SIMULATOR_UNITCALL_H
#define MORVIK_BINDINGS_SIMULATOR_UNITCALL_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

namespace morvik::simulator {

/// The inputs of the next call, and the results of the last one.
class UnitCall {
public:
    /// Appends an input. Beyond what any unit takes, they are dropped.
    void put(std::int32_t value) noexcept;

    /// Computes the results of the unit with this number (hardware/units/Ports.h) from the inputs, and forgets those.
    /// Returns how many results there are, 0 if something was refused.
    std::int32_t compute(std::int32_t unit, std::int32_t algorithm);

    /// A result; units::unknownValue for a number that none has.
    std::int32_t result(std::int32_t number) const;

    /// Why the last call was refused, a line that begins with "ERROR:"; empty if it was not.
    const std::string& message() const;

private:
    static constexpr std::size_t most = 64;  ///< values; no unit has half of them

    std::array<std::int32_t, most> itsInputs{};
    std::size_t itsCount = 0;
    std::vector<std::int32_t> itsResults;
    std::string itsMessage;
};

}  // namespace morvik::simulator

#endif

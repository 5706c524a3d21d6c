// UnitCall: calls of the core's units for simulators, which pass values one by one.
#include "UnitCall.h"

#include <cstddef>
#include <exception>
#include <utility>

#include "hardware/units/Ports.h"

namespace morvik::simulator {

void UnitCall::put(std::int32_t value) noexcept
{
    if (itsCount < itsInputs.size()) {
        itsInputs[itsCount++] = value;
    }
}

std::int32_t UnitCall::compute(std::int32_t unit, std::int32_t algorithm)
{
    const std::size_t count = std::exchange(itsCount, 0);
    itsResults.clear();
    itsMessage.clear();
    try {
        const std::vector<std::int32_t> inputs(itsInputs.data(), itsInputs.data() + count);
        if (unit < 0 || static_cast<std::size_t>(unit) >= units::allUnits().size()) {
            throw units::BadInput("unit " + std::to_string(unit) + " is not allowed, expected 0 to " +
                                  std::to_string(units::allUnits().size() - 1));
        }
        itsResults = units::compute(static_cast<units::Number>(unit), algorithm, inputs);
    } catch (const std::exception& error) {
        itsMessage = std::string("ERROR:unit:") + error.what();
    }
    return static_cast<std::int32_t>(itsResults.size());
}

std::int32_t UnitCall::result(std::int32_t number) const
{
    const auto index = static_cast<std::size_t>(number);
    return index < itsResults.size() ? itsResults[index] : units::unknownValue;
}

const std::string& UnitCall::message() const
{
    return itsMessage;
}

}  // namespace morvik::simulator

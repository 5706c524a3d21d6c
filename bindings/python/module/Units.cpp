// Units: the units of the core, for the package.
#include "Units.h"

#include <algorithm>
#include <cstdint>
#include <string>
#include <vector>

#include "Arrays.h"
#include "Decoder.h"
#include "hardware/units/Ports.h"

namespace py = pybind11;

namespace morvik::python {

namespace {

/// The results of a unit for each row of inputs. Throws Refusal, which names the row if there are several.
Array<std::int16_t> compute(const std::string& name, std::int32_t algorithm, const Array<std::int32_t>& inputs)
{
    const units::Number unit = units::findUnit(name).value();
    const units::Unit& described = units::allUnits()[static_cast<std::size_t>(unit)];
    const py::ssize_t cases = inputs.shape(0);
    const auto outputs = static_cast<py::ssize_t>(units::valuesOf(described.outputs));
    Array<std::int16_t> results({cases, outputs});
    std::vector<std::int32_t> row(sizeOf(inputs.shape(1)));
    for (py::ssize_t i = 0; i < cases; ++i) {
        std::copy_n(inputs.data() + i * inputs.shape(1), row.size(), row.begin());
        try {
            const std::vector<std::int32_t> computed = units::compute(unit, algorithm, row);
            std::transform(
                computed.begin(), computed.end(), results.mutable_data() + i * outputs, [](std::int32_t value) {
                    return static_cast<std::int16_t>(value);
                });
        } catch (const units::BadInput& error) {
            throw Refusal((cases > 1 ? "case " + std::to_string(i) + ": " : std::string()) + error.what());
        }
    }
    return results;
}

}  // namespace

void addUnits(py::module_& module)
{
    module.def("unit", &compute, py::arg("name"), py::arg("algorithm"), py::arg("inputs").noconvert());
}

}  // namespace morvik::python

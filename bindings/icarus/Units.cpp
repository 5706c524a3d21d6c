// Units: the units of the core as system functions of Verilog. docs/units.md explains them.
//
//     status = $morvik_unit_intrinsic(apriori, systematic, twice_intrinsic);              0, or 2 after an error
//     status = $morvik_unit_branch(twice_intrinsic, parity, g);
//     status = $morvik_unit_forward(algorithm, alpha, pending, g, next, next_pending);
//     status = $morvik_unit_backward(algorithm, beta, pending, g, previous, previous_pending);
//     status = $morvik_unit_ratio(algorithm, alpha, beta, g, ratio);
//     status = $morvik_unit_extrinsic(algorithm, ratio, twice_intrinsic, extrinsic);
//     status = $morvik_unit_address(block_size, step, address);
//     status = $morvik_unit_tail(systematic, parity, beta);
//     status = $morvik_unit_border(column, border);
//
// A row is a vector of all its values side by side, the first in the lowest bits: 96 bits for eight metrics, 32 for
// four branch metrics, 24 for three soft values or for eight pending corrections.
#include "Units.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <exception>

#include "Vpi.h"
#include "hardware/units/Ports.h"
#include "morvik_checker.h"

namespace morvik::icarus {

namespace {

using units::Kind;
using units::Port;

constexpr unsigned wordBits = 32;

/// A unit's system function.
struct Function {
    std::string name;
    units::Number number;
    bool hasAlgorithm;
};

unsigned widthOf(const Port& port)
{
    return port.count * units::rangeOf(port.kind).bits;
}

const units::Unit& unitOf(const Function& function)
{
    return units::allUnits()[static_cast<std::size_t>(function.number)];
}

/// The algorithm, inputs and outputs that a call has.
std::size_t argumentCount(const Function& function)
{
    return (function.hasAlgorithm ? 1 : 0) + unitOf(function).inputs.size() + unitOf(function).outputs.size();
}

void expectInteger(vpiHandle object, const std::string& name)
{
    if (isArray(object)) {
        throw Mistake(name + " is an array, but must be a value");
    }
    if (!isInteger(object)) {
        throw Mistake(name + " must be an integer");
    }
}

void checkPort(vpiHandle object, const Port& port, bool isOutput)
{
    expectInteger(object, port.name);
    const auto width = static_cast<unsigned>(vpi_get(vpiSize, object));
    if (port.count > 1 && width != widthOf(port)) {
        throw Mistake(std::string(port.name) + " has " + std::to_string(width) + " bits, but " +
                      std::to_string(port.count) + " values of " + std::to_string(units::rangeOf(port.kind).bits) +
                      " bits have " + std::to_string(widthOf(port)));
    }
    // An address may be in a narrower register, if that is enough for the block size.
    if (port.count == 1 && isOutput && width < widthOf(port) && port.kind != units::Kind::step) {
        throw Mistake(std::string(port.name) + " has " + std::to_string(width) + " bits, but its values have " +
                      std::to_string(widthOf(port)));
    }
    if (isOutput && (isConstant(object) || vpi_get(vpiType, object) == vpiNet)) {
        throw Mistake(std::string(port.name) + " receives a result, so it must be a variable");
    }
}

/// At compile time of the design: checks the number and the kinds of the arguments.
PLI_INT32 check(PLI_BYTE8* data)  // NOLINT(readability-non-const-parameter): the interface's type
{
    const auto& function = *reinterpret_cast<const Function*>(data);
    try {
        const auto arguments = argumentsOf(vpi_handle(vpiSysTfCall, nullptr));
        if (arguments.size() != argumentCount(function)) {
            throw Mistake("takes " + std::to_string(argumentCount(function)) + " arguments, not " +
                          std::to_string(arguments.size()));
        }
        auto next = arguments.begin();
        if (function.hasAlgorithm) {
            expectInteger(*next++, "algorithm");
        }
        for (const Port& port : unitOf(function).inputs) {
            checkPort(*next++, port, false);
        }
        for (const Port& port : unitOf(function).outputs) {
            checkPort(*next++, port, true);
        }
    } catch (const std::exception& error) {
        failCompilation(function.name + ": " + error.what());
    }
    return 0;
}

/// The bits of a vector, at most those of a row.
class Bits {
public:
    /// Takes a value; x and z stay.
    explicit Bits(vpiHandle object)
    {
        s_vpi_value value{};
        value.format = vpiVectorVal;
        vpi_get_value(object, &value);
        const auto count = static_cast<unsigned>(vpi_get(vpiSize, object));
        std::copy_n(value.value.vector, (count + wordBits - 1) / wordBits, itsWords.begin());
    }

    Bits() = default;

    /// A value in two's complement, or units::unknownValue.
    std::int32_t value(unsigned first, unsigned bits, bool isSigned) const
    {
        std::uint32_t number = 0;
        for (unsigned i = 0; i < bits; ++i) {
            const s_vpi_vecval& word = itsWords[(first + i) / wordBits];
            const unsigned place = (first + i) % wordBits;
            if ((static_cast<std::uint32_t>(word.bval) >> place & 1U) != 0) {
                return units::unknownValue;
            }
            number |= (static_cast<std::uint32_t>(word.aval) >> place & 1U) << i;
        }
        const std::uint32_t sign = isSigned ? std::uint32_t{1} << (bits - 1) : 0;
        return static_cast<std::int32_t>((number ^ sign) - sign);
    }

    void setValue(unsigned first, unsigned bits, std::int32_t value)
    {
        for (unsigned i = 0; i < bits; ++i) {
            const std::uint32_t bit = static_cast<std::uint32_t>(value) >> i & 1U;
            s_vpi_vecval& word = itsWords[(first + i) / wordBits];
            word.aval = static_cast<PLI_INT32>(static_cast<std::uint32_t>(word.aval) | bit << (first + i) % wordBits);
        }
    }

    void put(vpiHandle object)
    {
        s_vpi_value value{};
        value.format = vpiVectorVal;
        value.value.vector = itsWords.data();
        vpi_put_value(object, &value, nullptr, vpiNoDelay);
    }

private:
    std::array<s_vpi_vecval, 4> itsWords{};
};

void appendInputs(vpiHandle object, const Port& port, std::vector<std::int32_t>& inputs)
{
    if (port.count == 1) {
        // As $morvik_observe takes them: a register's bits, however it is declared.
        inputs.push_back(units::isSigned(port.kind) ? valueOf(object, true, port.name) : argument(object, port.name));
        return;
    }
    const Bits vector(object);
    const unsigned bits = units::rangeOf(port.kind).bits;
    for (unsigned i = 0; i < port.count; ++i) {
        inputs.push_back(vector.value(i * bits, bits, units::isSigned(port.kind)));
    }
}

void setOutput(vpiHandle object, const Port& port, const std::int32_t* values)
{
    if (port.count == 1) {
        setValue(object, *values);
        return;
    }
    Bits vector;
    const unsigned bits = units::rangeOf(port.kind).bits;
    for (unsigned i = 0; i < port.count; ++i) {
        vector.setValue(i * bits, bits, values[i]);
    }
    vector.put(object);
}

void compute(const Function& function, const std::vector<vpiHandle>& arguments)
{
    auto next = arguments.begin();
    const int algorithm = function.hasAlgorithm ? argument(*next++, "algorithm") : 0;
    std::vector<std::int32_t> inputs;
    for (const Port& port : unitOf(function).inputs) {
        appendInputs(*next++, port, inputs);
    }
    const std::vector<std::int32_t> results = units::compute(function.number, algorithm, inputs);
    const std::int32_t* values = results.data();
    for (const Port& port : unitOf(function).outputs) {
        setOutput(*next++, port, values);
        values += port.count;
    }
}

PLI_INT32 run(PLI_BYTE8* data)  // NOLINT(readability-non-const-parameter): the interface's type
{
    const auto& function = *reinterpret_cast<const Function*>(data);
    vpiHandle call = vpi_handle(vpiSysTfCall, nullptr);
    int status = MORVIK_CHECKER_AGREES;
    try {
        compute(function, argumentsOf(call));
    } catch (const std::exception& error) {
        report("ERROR", function.name + ": " + error.what());
        status = MORVIK_CHECKER_REFUSED;
    }
    setValue(call, status);
    return 0;
}

bool dependsOnAlgorithm(units::Number unit)
{
    return unit == units::Number::forward || unit == units::Number::backward || unit == units::Number::ratio ||
           unit == units::Number::extrinsic;
}

std::vector<Function> functionsOfAll()
{
    std::vector<Function> functions;
    for (const units::Unit& unit : units::allUnits()) {
        const units::Number number = *units::findUnit(unit.name);
        functions.push_back({std::string("$morvik_unit_") + unit.name, number, dependsOnAlgorithm(number)});
    }
    return functions;
}

}  // namespace

void announceUnits()
{
    static const std::vector<Function> functions = functionsOfAll();
    for (const Function& function : functions) {
        s_vpi_systf_data data{};
        data.type = vpiSysFunc;
        data.sysfunctype = vpiIntFunc;
        data.tfname = text(function.name.c_str());
        data.calltf = run;
        data.compiletf = check;
        data.user_data = text(reinterpret_cast<const char*>(&function));
        vpi_register_systf(&data);
    }
}

}  // namespace morvik::icarus

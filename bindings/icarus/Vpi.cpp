// Vpi: values, arguments and messages of a simulator with VPI.
#include "Vpi.h"

#include <cstdint>

namespace morvik::icarus {

char* text(const char* constant)
{
    return const_cast<char*>(constant);
}

void report(const char* severity, const std::string& line)
{
    vpiHandle call = vpi_handle(vpiSysTfCall, nullptr);
    vpi_printf(text("%s: %s:%d: morvik: %s\n"),
               severity,
               vpi_get_str(vpiFile, call),
               static_cast<int>(vpi_get(vpiLineNo, call)),
               line.c_str());
}

void failCompilation(const std::string& line)
{
    report("ERROR", line);
    vpip_set_return_value(1);
    vpi_control(vpiFinish, 1);
}

std::vector<vpiHandle> argumentsOf(vpiHandle call)
{
    std::vector<vpiHandle> all;
    vpiHandle iterator = vpi_iterate(vpiArgument, call);
    if (iterator != nullptr) {
        while (vpiHandle argument = vpi_scan(iterator)) {
            all.push_back(argument);
        }
    }
    return all;
}

int valueOf(vpiHandle object, bool isSigned, const std::string& name)
{
    const int width = vpi_get(vpiSize, object);
    s_vpi_value value{};
    value.format = vpiVectorVal;
    vpi_get_value(object, &value);
    const s_vpi_vecval* const words = value.value.vector;
    const auto bits = static_cast<std::uint32_t>(words[0].aval);
    const bool isNegative = isSigned && width > 32 && bits >> 31 != 0;
    for (int i = 0; i * 32 < width; ++i) {
        if (words[i].bval != 0) {
            throw Mistake(name + " has bits that are x or z");
        }
        const int unused = width - i * 32 < 32 ? 32 - (width - i * 32) : 0;
        const std::uint32_t extension = isNegative ? ~std::uint32_t{0} >> unused : 0;
        if (i > 0 && static_cast<std::uint32_t>(words[i].aval) != extension) {
            throw Mistake(name + " does not fit in 32 bits");
        }
    }
    const std::uint32_t sign = isSigned && width < 32 ? std::uint32_t{1} << (width - 1) : 0;
    return static_cast<std::int32_t>((bits ^ sign) - sign);
}

int argument(vpiHandle object, const std::string& name)
{
    return valueOf(object, vpi_get(vpiSigned, object) != 0, name);
}

void setValue(vpiHandle object, int integer)
{
    s_vpi_value value{};
    value.format = vpiIntVal;
    value.value.integer = integer;
    vpi_put_value(object, &value, nullptr, vpiNoDelay);
}

bool isConstant(vpiHandle object)
{
    const int type = vpi_get(vpiType, object);
    return type == vpiConstant || type == vpiParameter;
}

bool isString(vpiHandle object)
{
    return isConstant(object) && vpi_get(vpiConstType, object) == vpiStringConst;
}

bool isArray(vpiHandle object)
{
    const int type = vpi_get(vpiType, object);
    return type == vpiMemory || type == vpiNetArray;
}

bool isInteger(vpiHandle object)
{
    if (isConstant(object)) {
        const int kind = vpi_get(vpiConstType, object);
        return kind != vpiRealConst && kind != vpiStringConst;
    }
    const int type = vpi_get(vpiType, object);
    return type != vpiRealVar && type != vpiStringVar;
}

}  // namespace morvik::icarus

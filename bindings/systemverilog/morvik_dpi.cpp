// morvik_dpi: the C functions that morvik_pkg.sv imports. No exception passes into the simulator.
#include "morvik_dpi.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <exception>

#include "bindings/simulator/Session.h"
#include "bindings/simulator/UnitCall.h"
#include "morvik_checker.h"

namespace {

using morvik::simulator::Session;

Session* sessionOf(void* decoder)
{
    return static_cast<Session*>(decoder);
}

/// Calls of units by this thread.
morvik::simulator::UnitCall& unitCall()
{
    thread_local morvik::simulator::UnitCall call;
    return call;
}

/// Only memory can fail in a session.
constexpr int outOfMemory = 99;

}  // namespace

void* morvik_dpi_create(int num_pu, int algorithm, int tag_width)
{
    try {
        return new Session(num_pu, algorithm, tag_width);
    } catch (const std::exception&) {
        return nullptr;
    }
}

void morvik_dpi_destroy(void* decoder)
{
    delete sessionOf(decoder);
}

int morvik_dpi_is_open(void* decoder)
{
    return decoder != nullptr && sessionOf(decoder)->open() ? 1 : 0;
}

void morvik_dpi_put(void* decoder, int sys, int par1, int par2)
{
    if (decoder != nullptr) {
        sessionOf(decoder)->put(sys, par1, par2);
    }
}

int morvik_dpi_decode(void* decoder, int iterations, unsigned int tag)
{
    if (decoder == nullptr) {
        return 1;
    }
    try {
        return sessionOf(decoder)->decode(iterations, tag);
    } catch (const std::exception&) {
        return outOfMemory;
    }
}

int morvik_dpi_size(void* decoder)
{
    return decoder == nullptr ? 0 : static_cast<int>(sessionOf(decoder)->bits().size());
}

int morvik_dpi_bit(void* decoder, int position)
{
    return position >= 0 && position < morvik_dpi_size(decoder)
               ? sessionOf(decoder)->bits()[static_cast<std::size_t>(position)]
               : 0;
}

unsigned int morvik_dpi_tag(void* decoder)
{
    return decoder == nullptr ? 0 : sessionOf(decoder)->tag();
}

const char* morvik_dpi_message(void* decoder)
{
    return decoder == nullptr ? "" : sessionOf(decoder)->nextMessage().c_str();
}

int morvik_dpi_observe_row(void* checker,
                           int signal,
                           int half_iteration,
                           int step,
                           int value0,
                           int value1,
                           int value2,
                           int value3,
                           int value4,
                           int value5,
                           int value6,
                           int value7)
{
    const std::array<std::int32_t, 8> values = {value0, value1, value2, value3, value4, value5, value6, value7};
    return morvik_checker_observe_row(
        static_cast<morvik_checker*>(checker), signal, half_iteration, step, values.data());
}

void morvik_dpi_unit_put(int value)
{
    unitCall().put(value);
}

int morvik_dpi_unit_compute(int unit, int algorithm)
{
    return unitCall().compute(unit, algorithm);
}

int morvik_dpi_unit_result(int number)
{
    return unitCall().result(number);
}

const char* morvik_dpi_unit_message(void)
{
    return unitCall().message().c_str();
}

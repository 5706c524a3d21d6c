// dump_fuzz: the readers of dumps of hardware simulations, and of the maps that name their signals, take any text.
#include <sstream>

#include "FuzzInput.h"
#include "base/Error.h"
#include "hardware/comparison/Dump.h"

namespace {

using morvik::comparison::Dump;
using morvik::comparison::NameMap;
using morvik::comparison::Values;

constexpr unsigned passes = 2;
constexpr unsigned steps = 43;

/// The map of the text; without text that of a dump with the model's names.
NameMap mapOf(const std::string& text)
{
    std::istringstream stream(text);
    return text.empty() ? NameMap() : morvik::comparison::readNameMap(stream, "in");
}

void requireRange(const Dump& dump)
{
    for (unsigned pass = 0; pass < passes; ++pass) {
        for (unsigned signal = 0; signal < morvik::signalCount; ++signal) {
            for (unsigned step = 0; step < steps; ++step) {
                const auto value = dump.values.at({pass, signal, step});
                require(value == Values::missing || value == Values::unknown ||
                            (value >= Values::smallest && value <= Values::largest),
                        "a value has 12 bits");
            }
        }
    }
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    FuzzInput input(data, size);
    const bool isVcd = input.below(2) != 0;
    const std::string map = input.part();
    std::istringstream text(input.text());
    Dump dump(passes, steps);
    try {
        const NameMap names = mapOf(map);
        (isVcd ? morvik::comparison::readVcd : morvik::comparison::readCsv)(text, "in", names, dump);
        completeTwins("in", names, dump);
    } catch (const morvik::base::Error& error) {
        requireOneLine(error, "in");
    }
    requireRange(dump);
    return 0;
}

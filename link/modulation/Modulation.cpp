// Modulation: the modulations of 3GPP TS 36.211, clause 7.1, and BPSK on one dimension.
#include "Modulation.h"

#include <cmath>

namespace morvik::link {

namespace {

constexpr std::array<std::string_view, modulations.size()> names = {"bpsk", "qpsk", "16qam", "64qam", "256qam"};

}  // namespace

std::string_view nameOf(Modulation modulation)
{
    return names[static_cast<unsigned>(modulation)];
}

std::optional<Modulation> modulationOf(std::string_view name)
{
    for (const Modulation modulation : modulations) {
        if (nameOf(modulation) == name) {
            return modulation;
        }
    }
    return std::nullopt;
}

float unitAmplitude(Modulation modulation)
{
    // The mean square of the odd numbers below 2^m is (4^m - 1) / 3.
    const unsigned levels = 1U << bitsPerDimension(modulation);
    return 1 / std::sqrt(static_cast<float>(dimensions(modulation) * (levels * levels - 1)) / 3);
}

}  // namespace morvik::link

// Modulation: the modulations of 3GPP TS 36.211, clause 7.1, and BPSK on one dimension.
//
// A dimension of a symbol (I or Q) carries every other bit of it: odd multiples of a unit amplitude, in Gray order.
#ifndef MORVIK_LINK_MODULATION_MODULATION_H
#define MORVIK_LINK_MODULATION_MODULATION_H

#include <array>
#include <optional>
#include <string_view>

namespace morvik::link {

enum class Modulation { bpsk, qpsk, qam16, qam64, qam256 };

constexpr std::array<Modulation, 5> modulations = {
    Modulation::bpsk, Modulation::qpsk, Modulation::qam16, Modulation::qam64, Modulation::qam256};

/// bpsk, qpsk, 16qam, 64qam, 256qam.
std::string_view nameOf(Modulation modulation);
std::optional<Modulation> modulationOf(std::string_view name);

/// Bits of a symbol: 1, 2, 4, 6 or 8 (Q_m).
constexpr unsigned bitsPerSymbol(Modulation modulation)
{
    return modulation == Modulation::bpsk ? 1 : 2 * static_cast<unsigned>(modulation);
}

/// Numbers of a symbol: I and Q; one for BPSK.
constexpr unsigned dimensions(Modulation modulation)
{
    return modulation == Modulation::bpsk ? 1 : 2;
}

/// Bits of each dimension, 1 to 4.
constexpr unsigned bitsPerDimension(Modulation modulation)
{
    return bitsPerSymbol(modulation) / dimensions(modulation);
}

/// The smallest amplitude of a dimension, for symbols of mean energy 1: 1, or 1 / sqrt(2, 10, 42, 170).
float unitAmplitude(Modulation modulation);

}  // namespace morvik::link

#endif

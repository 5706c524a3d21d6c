// Demapper: computes the log-likelihood ratios of the bits of received symbols.
//
// Results are the same on every machine: they come from additions, multiplications and divisions of IEEE floats only.
#ifndef MORVIK_LINK_MODULATION_DEMAPPER_H
#define MORVIK_LINK_MODULATION_DEMAPPER_H

#include <array>
#include <cstddef>
#include <optional>
#include <string_view>

#include "Modulation.h"

namespace morvik::link {

enum class Demapper {
    maxLog,  ///< the nearest point with a 0 against the nearest with a 1
    exact,   ///< all points with a 0 against all with a 1
};

constexpr std::array<Demapper, 2> demappers = {Demapper::maxLog, Demapper::exact};

/// max-log, exact.
std::string_view nameOf(Demapper demapper);
std::optional<Demapper> demapperOf(std::string_view name);

/// The ratios ln(P(1) / P(0)) of the bits of `count` symbols, bitsPerSymbol each.
///
/// symbols          as mapSymbols makes them, times gain, plus noise
/// gains            one of each symbol, at least 0; or null: all are 1
/// noiseVariance    of I and Q together, N0, above 0; the single dimension of BPSK has half of it
void demapSymbols(Modulation modulation,
                  Demapper demapper,
                  const float* symbols,
                  const float* gains,
                  float noiseVariance,
                  std::size_t count,
                  float* ratios);

/// The same for any finite symbols and gains and any noise, where demapSymbols could leave the range of a float: such
/// ratios become its ends.
void demapAnySymbols(Modulation modulation,
                     Demapper demapper,
                     const float* symbols,
                     const float* gains,
                     float noiseVariance,
                     std::size_t count,
                     float* ratios);

}  // namespace morvik::link

#endif

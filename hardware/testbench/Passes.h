// Passes: every value that the core computes on a block, one half-iteration at a time.
#ifndef MORVIK_HARDWARE_TESTBENCH_PASSES_H
#define MORVIK_HARDWARE_TESTBENCH_PASSES_H

#include <array>
#include <cstdint>
#include <ostream>

#include "Decoder.h"
#include "rules/Cut.h"
#include "rules/Formats.h"
#include "rules/Schedule.h"

class TDecoder3GPU;

namespace morvik {

/// The signals of a trellis step, in the order in which a pass computes them.
constexpr std::array<const char*, 23> passSignals = {"intrinsic", "g0",     "g1",     "g2",     "g3",       "alpha0",
                                                     "alpha1",    "alpha2", "alpha3", "alpha4", "alpha5",   "alpha6",
                                                     "alpha7",    "beta0",  "beta1",  "beta2",  "beta3",    "beta4",
                                                     "beta5",     "beta6",  "beta7",  "llr",    "extrinsic"};

/// Bits of each signal, in two's complement, in eighths: -2048 stands for -256, 2047 for 255.875.
constexpr unsigned passBits = rules::stateBits;

/// The encoder, 1 or 2, whose constituent code a half-iteration decodes: half-iteration 0 decodes the second, the
/// interleaved one (rule 15).
constexpr unsigned constituentCode(unsigned halfIteration)
{
    return rules::constituentOf(halfIteration) + 1;
}

/// Runs half-iterations on a block, on a fresh decoder.
class Passes {
public:
    /// Throws Refusal if the library refuses generics or block. `warnings` must outlive the passes.
    Passes(const SoftBlock& block, const veltra_ip_morvik_v1_0_generics& generics, std::ostream& warnings);

    /// How the core cuts the block.
    const rules::Cut& cut() const;

    /// The component that computes, with the streams of both constituent codes.
    const TDecoder3GPU& component() const;

    /// Computes the next half-iteration, starting with 0.
    void next();

    /// A value of the half-iteration in eighths, -2048 to 2047; bits below them are dropped (rule 22). `step` is from 0
    /// to K + 2.
    std::int16_t value(unsigned signal, std::uint32_t step) const;

    /// Whether the core computes the signal at the step: in the tail, only intrinsic values, and the forward metrics
    /// that step K - 1 leads to. Others are 0 or meaningless.
    bool isComputed(unsigned signal, std::uint32_t step) const;

private:
    Decoder itsDecoder;
    TDecoder3GPU& itsComponent;
    rules::Cut itsCut;
    unsigned itsNext = 0;
};

}  // namespace morvik

#endif

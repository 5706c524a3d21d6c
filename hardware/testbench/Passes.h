// Passes: every value that the core computes on a block, one half-iteration at a time.
#ifndef MORVIK_HARDWARE_TESTBENCH_PASSES_H
#define MORVIK_HARDWARE_TESTBENCH_PASSES_H

#include <cstdint>
#include <ostream>

#include "Decoder.h"
#include "Signals.h"
#include "rules/Cut.h"
#include "rules/Schedule.h"

class TDecoder3GPU;

namespace morvik {

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

    /// Whether the core computes the signal at the step (stepsAfterBits). Other values are 0 or meaningless.
    bool isComputed(unsigned signal, std::uint32_t step) const;

    /// Writes all values that the core computes of a signal, by step; much faster than one after the other.
    void copyValues(unsigned signal, std::int16_t* values) const;

private:
    std::uint32_t computedSteps(unsigned signal) const;

    Decoder itsDecoder;
    TDecoder3GPU& itsComponent;
    rules::Cut itsCut;
    unsigned itsNext = 0;
};

}  // namespace morvik

#endif

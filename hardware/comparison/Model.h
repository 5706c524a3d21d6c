// Model: every value that the core computes on a block, and how it cuts the block.
#ifndef MORVIK_HARDWARE_COMPARISON_MODEL_H
#define MORVIK_HARDWARE_COMPARISON_MODEL_H

#include <array>
#include <cstdint>
#include <optional>
#include <ostream>
#include <vector>

#include "Values.h"
#include "hardware/testbench/Passes.h"
#include "hardware/testbench/SoftBlock.h"
#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik::comparison {

/// The streams and permutation of a constituent code: 0 natural, 1 interleaved. K + 3 soft values each, as aligned
/// words of the state format.
struct Code {
    std::vector<short> systematic;
    std::vector<short> parity;
    std::vector<unsigned> order;  ///< entry j is the position of step j in the other code's order
};

/// Which of the two codes a half-iteration decodes.
constexpr unsigned codeOf(unsigned pass)
{
    return rules::constituentOf(pass);
}

struct Model {
    veltra_ip_morvik_v1_0_generics generics;
    Values values;  ///< only those that the core computes
    rules::Cut cut;
    std::array<Code, 2> codes;
};

/// The address of the extrinsic value that an intrinsic value takes: the step of the pass before; nothing if there is
/// none.
inline std::optional<unsigned> extrinsicAddress(const Model& model, const Place& place)
{
    const bool hasOne = stageOf(place.signal) == Stage::intrinsic && place.pass > 0 && place.step < model.cut.K();
    return hasOne ? std::optional(model.codes[codeOf(place.pass)].order[place.step]) : std::nullopt;
}

/// Decodes the block; the library's warnings go to `warnings`. Throws Refusal if the library refuses.
Model computeModel(const SoftBlock& block,
                   const veltra_ip_morvik_v1_0_generics& generics,
                   unsigned iterations,
                   std::ostream& warnings);

/// Whether all values of the dump equal the core's on the block. Values that the core does not compute are ignored.
bool computesAll(const SoftBlock& block, const veltra_ip_morvik_v1_0_generics& generics, const Values& dump);

/// The steps of a stage in the core's order of computation: segments in parallel, the backward recursion window by
/// window from its end.
std::vector<unsigned> stepsInOrder(const rules::Cut& cut, Stage stage);

}  // namespace morvik::comparison

#endif

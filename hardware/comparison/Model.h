// Model: every value that the core computes on a block, and how it cuts the block.
#ifndef MORVIK_HARDWARE_COMPARISON_MODEL_H
#define MORVIK_HARDWARE_COMPARISON_MODEL_H

#include <array>
#include <cstdint>
#include <ostream>
#include <vector>

#include "Values.h"
#include "hardware/testbench/Passes.h"
#include "hardware/testbench/SoftBlock.h"
#include "morvik_v1_0_bitacc_cmodel.h"

namespace morvik::comparison {

/// The streams and permutations of the two constituent codes: 0 natural, 1 interleaved. Soft values are aligned words
/// of the state format, K + 3 of them.
struct Code {
    std::vector<short> systematic;
    std::vector<short> parity;
    std::vector<unsigned> order;  ///< entry j is the place in the other code's order of what step j works on
};

/// Which of the two codes a half-iteration decodes.
constexpr unsigned codeOf(unsigned pass)
{
    return rules::constituentOf(pass);
}

struct Model {
    veltra_ip_morvik_v1_0_generics generics;
    Values values;  ///< those that the core computes, and no others
    rules::Cut cut;
    std::array<Code, 2> codes;
};

/// Decodes the block; the library's warnings go to the stream. Throws Refusal when the library refuses.
Model computeModel(const SoftBlock& block,
                   const veltra_ip_morvik_v1_0_generics& generics,
                   unsigned iterations,
                   std::ostream& warnings);

/// Whether all values of the dump are those that the core computes on the block. Values where it computes none do not
/// count.
bool computesAll(const SoftBlock& block, const veltra_ip_morvik_v1_0_generics& generics, const Values& dump);

/// The steps of a stage in the order in which the core computes them: the segments at the same time, the backward
/// recursion window by window from its end.
std::vector<unsigned> stepsInOrder(const rules::Cut& cut, Stage stage);

}  // namespace morvik::comparison

#endif

// An independent formulation of the whole LTE decoder for checking, window by window from the flow of border metrics.
#ifndef MORVIK_TESTS_SUPPORT_PLAINDECODER_H
#define MORVIK_TESTS_SUPPORT_PLAINDECODER_H

#include <optional>
#include <vector>

#include "PlainTrellis.h"

namespace morvik::plain {

bool knownBlockSize(unsigned K);

// Entry i is the source of position i of the interleaved block; empty for an unknown size.
std::vector<unsigned> permutation(unsigned K);

// The cut of a block into segments of equal length, each with the same windows.
struct Segmentation {
    unsigned segments = 0;
    unsigned length = 0;
    std::vector<unsigned> windowOffsets;  // from the beginning of the segment
    std::vector<unsigned> windowLengths;
};

// `processors` is the number of processing units times their four threads. Returns nullopt if the segments do not
// divide the block.
std::optional<Segmentation> segmentation(unsigned K, unsigned processors);

// The values of one soft-in/soft-out pass, in the order of its constituent code.
struct Pass {
    std::vector<int> intrinsic;       // K + 3, with the termination
    std::vector<BranchColumn> gamma;  // K
    std::vector<Column> alpha;        // K + 1: alpha[k] before step k
    std::vector<Column> beta;         // K: beta[k] after step k
    std::vector<int> llr;             // K
    std::vector<int> extrinsic;       // K
};

struct Result {
    std::vector<int> bits;
    std::vector<int> llr;        // of the last pass
    std::vector<int> extrinsic;  // of the last pass
    std::vector<Pass> passes;    // two for each iteration; the first one is in interleaved order
};

// Decodes three streams of K + 4 soft values as passed to the interface (any int). `algorithm` is the type 0, 1 or 2 of
// the configuration. Returns nullopt if the streams have no block's length.
std::optional<Result> decode(const std::vector<int>& sys,
                             const std::vector<int>& par1,
                             const std::vector<int>& par2,
                             unsigned units,
                             unsigned algorithm,
                             unsigned iterations);

}  // namespace morvik::plain

#endif

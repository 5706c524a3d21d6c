// NoisyBlocks: the code blocks on which all decoders are measured.
#ifndef MORVIK_BENCH_NOISYBLOCKS_H
#define MORVIK_BENCH_NOISYBLOCKS_H

#include <array>
#include <cstdint>
#include <vector>

namespace morvik::bench {

/// Codewords of one size, the same in every run, as soft values of the core's input format; the three streams block
/// after block, K + 4 values each.
struct NoisyBlocks {
    std::vector<std::uint8_t> sent;
    std::array<std::vector<std::int32_t>, 3> streams;
};

/// `count` blocks at an Eb/N0 of 1 dB.
NoisyBlocks noisyBlocks(unsigned K, unsigned count);

/// The same without noise.
NoisyBlocks cleanBlocks(unsigned K, unsigned count);

}  // namespace morvik::bench

#endif

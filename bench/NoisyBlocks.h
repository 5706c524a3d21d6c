// NoisyBlocks: the code blocks on which all decoders are measured.
#ifndef MORVIK_BENCH_NOISYBLOCKS_H
#define MORVIK_BENCH_NOISYBLOCKS_H

#include <array>
#include <cstdint>
#include <vector>

namespace morvik::bench {

/// Codewords, the same in every run, as soft values of the core's input format; the three streams block after block,
/// K + 4 values each.
struct NoisyBlocks {
    std::vector<std::uint8_t> sent;
    std::array<std::vector<std::int32_t>, 3> streams;
};

/// A block of each size, one or more, at an Eb/N0 of 1 dB.
NoisyBlocks noisyBlocks(const std::vector<unsigned>& sizes);

/// The same without noise.
NoisyBlocks cleanBlocks(const std::vector<unsigned>& sizes);

}  // namespace morvik::bench

#endif

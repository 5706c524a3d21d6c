// SelfCheck: compares what this machine decodes with the digests that every machine must produce.
#ifndef MORVIK_APP_SELFTEST_SELFCHECK_H
#define MORVIK_APP_SELFTEST_SELFCHECK_H

#include <array>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "CheckBlocks.h"

namespace morvik::selftest {

/// The core's configuration, as far as it affects decoded bits, and the digest of all decisions and log-likelihood
/// ratios of the check blocks.
struct Expectation {
    int numPu;
    int algorithm;
    std::uint64_t digest;
};

struct Promise {
    std::uint64_t blocks;  ///< of the check blocks themselves
    std::array<Expectation, 9> configurations;
};
extern const Promise promise;

/// The decisions and ratios of a batch.
struct Decided {
    std::vector<std::uint8_t> bits;
    std::vector<std::int16_t> ratios;
};

/// Decodes check batches in one configuration, in one way.
using Decode = std::function<void(const CheckBatch& batch, Decided& decided)>;

/// Creates a Decode; empty if the machine lacks the instruction set.
using MakeDecode = std::function<Decode(int numPu, int algorithm, const std::string& instructionSet)>;

/// Decodes with the library's batch interface, with 8-, 16- and 32-bit soft values in turn. Throws std::runtime_error
/// if the library refuses a configuration or a block.
Decode libraryDecode(int numPu, int algorithm, const std::string& instructionSet);

/// A configuration with a wrong digest.
struct Difference {
    int numPu;
    int algorithm;
    std::uint64_t expected;
    std::uint64_t found;
};

/// The result of one instruction set.
struct Outcome {
    std::string instructionSet;
    bool available = false;
    std::size_t configurations = 0;  ///< decoded
    std::vector<Difference> differences;
    double seconds = 0;
};

/// The results of a check.
struct Findings {
    std::string inUse;  ///< the instruction set that a decoder uses by default
    std::uint64_t blocks = 0;
    std::uint64_t bits = 0;  ///< in all blocks
    std::uint64_t blockDigest = 0;
    bool blocksRight = false;
    std::vector<Outcome> outcomes;  ///< one per instruction set, the component path last

    /// Whether the machine must have this instruction set: the one in use and those that every machine has.
    bool needs(const Outcome& outcome) const;

    /// The number of configurations decoded, over all instruction sets.
    std::size_t configurations() const;

    /// Whether all that is required was decoded, in all configurations, and nothing differs.
    bool right() const;
};

/// Decodes the check blocks in each configuration with each instruction set.
Findings check(const Promise& promised = promise, const MakeDecode& makeDecode = libraryDecode);

}  // namespace morvik::selftest

#endif

// SelfCheck: compares what this machine decodes with digests of what every machine has to decode.
#ifndef MORVIK_APP_SELFTEST_SELFCHECK_H
#define MORVIK_APP_SELFTEST_SELFCHECK_H

#include <array>
#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "CheckBlocks.h"

namespace morvik::selftest {

/// What the core is built with, as far as it decides about bits, and the digest of all decisions and log-likelihood
/// ratios of the check blocks.
struct Expectation {
    int numPu;
    int algorithm;
    std::uint64_t digest;
};

/// The digests that are promised.
struct Promise {
    std::uint64_t blocks;  ///< of the check blocks themselves
    std::array<Expectation, 9> configurations;
};
extern const Promise promise;

/// Decisions and ratios of a batch.
struct Decided {
    std::vector<std::uint8_t> bits;
    std::vector<std::int16_t> ratios;
};

/// Decodes check batches in one configuration, by one way of decoding.
using Decode = std::function<void(const CheckBatch& batch, Decided& decided)>;

/// Makes that; nothing if the machine lacks the instruction set.
using MakeDecode = std::function<Decode(int numPu, int algorithm, const std::string& instructionSet)>;

/// By the batch interface of the library, with 8-, 16- and 32-bit soft values in turn. Throws Refusal where the library
/// refuses a configuration or a block.
Decode libraryDecode(int numPu, int algorithm, const std::string& instructionSet);

/// A configuration that was decoded otherwise.
struct Difference {
    int numPu;
    int algorithm;
    std::uint64_t expected;
    std::uint64_t found;
};

/// What came of one instruction set.
struct Outcome {
    std::string instructionSet;
    bool available = false;
    std::size_t configurations = 0;  ///< that were decoded
    std::vector<Difference> differences;
    double seconds = 0;
};

/// All of a check.
struct Findings {
    std::string inUse;  ///< the instruction set that a decoder takes by itself
    std::uint64_t blocks = 0;
    std::uint64_t bits = 0;  ///< in all blocks
    std::uint64_t blockDigest = 0;
    bool blocksRight = false;
    std::vector<Outcome> outcomes;  ///< of each instruction set, the component path last

    /// Whether the machine has to have the instruction set of an outcome: the one in use and those that every machine
    /// has.
    bool needs(const Outcome& outcome) const;

    /// The configurations that were decoded, by all instruction sets.
    std::size_t configurations() const;

    /// Whether everything that has to be there has been decoded, in all configurations, and nothing differs.
    bool right() const;
};

/// Decodes the check blocks in each configuration with each instruction set.
Findings check(const Promise& promised = promise, const MakeDecode& makeDecode = libraryDecode);

}  // namespace morvik::selftest

#endif

// Diagnosis: why blocks do not decode into the bits that were sent.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_DIAGNOSIS_H
#define MORVIK_HARDWARE_DIAGNOSIS_DIAGNOSIS_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "Evidence.h"
#include "Mistakes.h"
#include "hardware/testbench/DecoderOptions.h"

namespace morvik::diagnosis {

/// The outcome for the blocks once some mistakes are undone.
struct Attempt {
    Mistakes mistakes;
    Signs signs;
    bool decodable = true;    ///< false for blocks with a wrong number of rows as they are
    std::size_t decoded = 0;  ///< blocks without a wrong bit
    std::uint64_t wrongBits = 0;
};

/// The noise of the received blocks, and how the decoder fares in such noise.
struct Noise {
    double ebn0 = 0;              ///< decibels
    std::size_t blockSize = 0;    ///< of the simulated blocks
    std::uint32_t simulated = 0;  ///< blocks
    std::uint32_t failed = 0;     ///< of them
};

enum class Verdict {
    healthy,      ///< all blocks decode as they are, and nothing looks mistaken
    mistaken,     ///< once the mistakes are undone all blocks decode
    careless,     ///< all blocks decode as they are, yet there are mistakes
    strange,      ///< blocks fail, and one stream is unrelated to the bits while the others are related
    noisy,        ///< blocks fail once the mistakes (if any) are undone, as others do in this noise
    unexplained,  ///< the same, but others do not fail in this noise
    unrelated,    ///< the soft values are unrelated to the bits, decoded or not
};

struct Diagnosis {
    Verdict verdict = Verdict::healthy;
    std::size_t blocks = 0;
    bool hasMore = false;                 ///< the file has blocks that were not examined
    std::vector<Attempt> attempts;        ///< as the blocks are, then each mistake by itself and the most likely
                                          ///< combinations, the best first
    Attempt best;                         ///< with the mistakes that were found
    Appearance appearance;                ///< once they are undone
    std::optional<std::size_t> stranger;  ///< the stream that is unrelated to the bits
    std::uint64_t clipped = 0;            ///< values of the file beyond -128 ... 127
    bool hasNegative = true;              ///< whether any value of the file is negative
    std::optional<Noise> noise;           ///< where blocks fail
};

/// Looks for mistakes that explain the cases. There must be at least one case; the numbers of bits must be block sizes,
/// and no case may have fewer rows than bits.
Diagnosis diagnose(const std::vector<Case>& cases, const DecoderOptions& options);

}  // namespace morvik::diagnosis

#endif

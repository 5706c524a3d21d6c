// Trial: decodes cases, and simulated blocks in the same noise.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_TRIAL_H
#define MORVIK_HARDWARE_DIAGNOSIS_TRIAL_H

#include <cstddef>
#include <cstdint>
#include <ostream>
#include <vector>

#include "Mistakes.h"
#include "hardware/testbench/Decoder.h"
#include "hardware/testbench/DecoderOptions.h"

namespace morvik::diagnosis {

class Trial {
public:
    /// Throws Refusal.
    explicit Trial(const DecoderOptions& options);

    struct Result {
        std::size_t decoded = 0;  ///< blocks without a wrong bit
        std::uint64_t wrongBits = 0;
        std::size_t failedSize = 0;  ///< bits of the first block with a wrong one
    };

    /// Cases with K + 4 rows.
    Result decode(const std::vector<Case>& cases);

private:
    std::ostream itsSilence;
    Decoder itsDecoder;
    std::uint32_t itsIterations;
};

/// How many of `blocks` simulated blocks of K bits fail. `scale` is the soft value for amplitude 1.
std::uint32_t simulatedFailures(
    const DecoderOptions& options, unsigned K, double ebn0, double scale, std::uint32_t blocks);

}  // namespace morvik::diagnosis

#endif

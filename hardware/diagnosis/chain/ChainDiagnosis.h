// ChainDiagnosis: why transport blocks do not decode into the bits that were sent.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINDIAGNOSIS_H
#define MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINDIAGNOSIS_H

#include <cstddef>
#include <cstdint>
#include <optional>
#include <vector>

#include "ChainEvidence.h"
#include "ChainSpread.h"
#include "hardware/diagnosis/Diagnosis.h"

namespace morvik::diagnosis {

/// The outcome for the transport blocks once some mistakes are undone.
struct ChainAttempt {
    ChainMistakes mistakes;
    Signs signs;
    std::size_t decoded = 0;  ///< transport blocks, without a wrong bit or with a CRC that fits
    std::uint64_t wrongBits = 0;
};

/// White Gaussian noise that makes as many signs wrong, and how the receiver fares in it.
struct ChainNoise {
    double esn0 = 0;              ///< decibels
    std::uint32_t simulated = 0;  ///< transport blocks
    std::uint32_t failed = 0;     ///< of them
};

/// Mistakes that explain many signs, but that no block decodes without, and beside which noise does not explain the
/// rest.
struct NearMiss {
    ChainAttempt attempt;
    double esn0 = 0;   ///< of noise that makes as many signs wrong,
    double limit = 0;  ///< and below which nothing can be decoded: Shannon's limit; both in decibels
};

struct ChainDiagnosis {
    ChainFormat format;
    Verdict verdict = Verdict::healthy;  ///< all but `strange`
    std::size_t blocks = 0;              ///< transport blocks
    std::size_t known = 0;               ///< those whose bits are known, by a reference or by a CRC that fits
    bool hasMore = false;                ///< the file has blocks that were not examined
    std::vector<ChainAttempt> attempts;  ///< as the blocks are, then the likeliest mistakes, the likeliest first
    ChainAttempt best;                   ///< with the mistakes that were found
    std::vector<ChainMistakes> equals;   ///< other mistakes, as many, that explain the signs as well
    std::optional<NearMiss> nearest;     ///< if there is one, no mistake is found
    std::optional<UnevenPart> uneven;  ///< where more signs are wrong than noise explains, if so, beside these mistakes
    Strength strength;                 ///< of the values, once the mistakes are undone
    double steps = 0;                  ///< of the core for a ratio of 1, or 0 if that is not known
    double suitableSteps = 0;          ///< what suits instead
    bool isContradictory = false;      ///< strong values are wrong too often for noise
    std::optional<ChainNoise> noise;   ///< where blocks fail, and noise may be why
};

/// Looks for mistakes that explain the cases, of which there must be at least one. `scale` is the core's steps for a
/// value of 1. Throws std::invalid_argument for a format that cannot be sent.
ChainDiagnosis diagnose(std::vector<ChainCase> cases,
                        const ChainFormat& format,
                        const DecoderOptions& options,
                        double scale);

}  // namespace morvik::diagnosis

#endif

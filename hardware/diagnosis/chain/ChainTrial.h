// ChainTrial: decodes transport blocks with mistakes undone, and simulated ones in the same noise.
#ifndef MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINTRIAL_H
#define MORVIK_HARDWARE_DIAGNOSIS_CHAIN_CHAINTRIAL_H

#include <cstddef>
#include <cstdint>
#include <ostream>
#include <vector>

#include "ChainEvidence.h"
#include "hardware/testbench/Decoder.h"
#include "hardware/testbench/DecoderOptions.h"

namespace morvik::diagnosis {

class ChainTrial {
public:
    /// `scale` is the core's steps for a value of 1. Throws Refusal.
    ChainTrial(const ChainFormat& format, const DecoderOptions& options, double scale);

    /// A transport block is decoded if all its bits are right or, where they are not known, if its CRC fits: after any
    /// of its transmissions.
    struct Result {
        std::size_t decoded = 0;
        std::uint64_t wrongBits = 0;  ///< of blocks whose bits are known, after the last transmission
    };
    Result decode(const std::vector<ChainCase>& cases, const ChainMistakes& mistakes);

    /// Whether the CRC of a transport block's first code block fits once the mistakes are undone.
    bool fitsAtFirst(const ChainCase& one, const ChainMistakes& mistakes);

    /// The bits of a transport block whose CRC fits once the mistakes are undone; empty if it does not.
    std::vector<std::uint8_t> bitsOf(const ChainCase& one, const ChainMistakes& mistakes);

private:
    void receive(const ChainCase& one,
                 std::size_t transmission,
                 const ChainMistakes& mistakes,
                 unsigned r,
                 std::vector<float>& sums) const;
    bool decodeBlock(unsigned r, const std::vector<float>& sums, const ChainMistakes& mistakes);
    SoftBlock softBlock(unsigned r, const std::vector<float>& sums, double scale) const;
    bool decode(const ChainCase& one, const ChainMistakes& mistakes);

    ChainFormat itsFormat;
    link::TransportBlockCode itsCode;
    double itsScale;
    std::uint32_t itsIterations;
    std::ostream itsSilence;
    Decoder itsDecoder;
    std::vector<std::uint64_t> itsRow;  // decided last
    std::vector<std::uint8_t> itsBits;  // its first A bits
    std::vector<std::uint8_t> itsDecisions;
};

/// The Es/N0 of white Gaussian noise, in decibels, that makes a fraction of the signs wrong.
double esn0Of(link::Modulation modulation, double wrongSigns);

/// The Es/N0 below which nothing can be decoded: Shannon's limit for all transmissions together, in decibels.
double limitOf(const ChainFormat& format);

/// How many of `blocks` transport blocks of the format fail at an Es/N0. `stepsPerRatio` is the core's steps for a
/// log-likelihood ratio of 1; 0 takes what suits.
std::uint32_t simulatedFailures(
    const ChainFormat& format, const DecoderOptions& options, double esn0, double stepsPerRatio, std::uint32_t blocks);

}  // namespace morvik::diagnosis

#endif

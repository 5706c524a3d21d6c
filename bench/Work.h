// Work: the decoding that is measured.
#ifndef MORVIK_BENCH_WORK_H
#define MORVIK_BENCH_WORK_H

#include <cstdint>
#include <string>
#include <vector>

#include "morvik_v1_0_batch.h"

namespace bench {

/// One line of the table.
struct Work {
    unsigned blockSize;
    int units;
    int algorithm;
    unsigned blocks;  ///< in one call; 1 takes the single call, more the batch
    unsigned iterations;
    std::string instructionSet;  ///< a name of the batch header, or "" for the best one

    std::string name() const;
};

/// The lines of the table, for the instruction sets that this machine has.
std::vector<Work> allWork();

/// A decoder and noisy codewords of Eb/N0 about 1 dB for it, the soft values 32-bit integers.
class Decoding {
public:
    explicit Decoding(const Work& work);
    ~Decoding();
    Decoding(const Decoding&) = delete;
    Decoding& operator=(const Decoding&) = delete;

    /// Decodes all blocks once; false when the library refuses.
    bool run();

    /// Information bits that a run decodes.
    double bits() const;

    /// Share of the bits that differ from the ones sent.
    double bitErrorRate() const;

    const char* instructionSet() const;

private:
    const Work itsWork;
    veltra_ip_morvik_v1_0_state* itsState;
    std::vector<std::int32_t> itsStreams[3];
    std::vector<std::uint8_t> itsSent;
    std::vector<std::uint8_t> itsDecisions;
};

}  // namespace bench

#endif

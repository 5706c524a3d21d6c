// Work: the decoding jobs to measure.
#ifndef MORVIK_BENCH_WORK_H
#define MORVIK_BENCH_WORK_H

#include <cstdint>
#include <memory>
#include <string>
#include <vector>

#include "NoisyBlocks.h"

namespace morvik::bench {

/// Full iterations, the same for every line.
constexpr unsigned iterations = 6;

/// One line of a table.
struct Work {
    enum class Decoder { morvik, itpp };
    enum class Call { single, batch };

    /// Blocks of one size, or of sizes drawn at random from all of the standard: as drawn, so that nearly each block
    /// has another size than the one before, or sorted.
    enum class Sizes { equal, drawn, sorted };

    unsigned blockSize;  ///< 0 for sizes that are drawn
    int units;           ///< of morvik, like the next three
    int algorithm;       ///< type 0, 1 or 2
    Call call;
    std::string instructionSet;  ///< a name of the batch header
    unsigned blocks;             ///< decoded at a time
    Decoder decoder = Decoder::morvik;
    bool compared = false;  ///< part of the comparison of decoders
    Sizes sizes = Sizes::equal;

    std::string name() const;

    /// The block size, or how sizes that are drawn follow each other.
    std::string sizeText() const;

    /// The size of each block.
    std::vector<unsigned> blockSizes() const;

    /// Calls per run.
    unsigned calls() const
    {
        return call == Call::batch ? 1 : blocks;
    }
};

/// The lines of all tables, in order, for the instruction sets of this machine.
std::vector<Work> allWork();

/// A decoder and its input blocks.
class Decoding {
public:
    virtual ~Decoding() = default;
    Decoding(const Decoding&) = delete;
    Decoding& operator=(const Decoding&) = delete;

    /// Decodes all blocks once.
    virtual void run() = 0;

    /// Decodes all blocks once. Throws when they are decoded wrongly: figures would stand for nothing.
    virtual void check() = 0;

    /// Fraction of the decided bits that differ from the transmitted ones.
    double bitErrorRate() const;

protected:
    explicit Decoding(const Work& work);

    const Work itsWork;
    const std::vector<unsigned> itsSizes;
    const NoisyBlocks itsBlocks;
    std::vector<std::uint8_t> itsDecisions;  ///< block after block
};

/// Throws if the work cannot be done.
std::unique_ptr<Decoding> makeDecoding(const Work& work);

}  // namespace morvik::bench

#endif

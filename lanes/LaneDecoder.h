// LaneDecoder: decodes several blocks of one size at once, one lane for each segment.
#ifndef MORVIK_LANES_LANEDECODER_H
#define MORVIK_LANES_LANEDECODER_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "Bounds.h"
#include "Kernels.h"
#include "LaneOrder.h"
#include "rules/Cut.h"
#include "rules/Tail.h"

namespace morvik::lanes {

using rules::Cut;
using rules::tailPositions;

/// The caller's three streams of a block, K + 4 values each, at any alignment.
template <class Input>
struct Streams {
    const Input* systematic;
    const Input* parity1;
    const Input* parity2;
};

/// The three streams of a block as loaded.
using LoadedBlock = std::array<std::vector<std::int16_t>, 3>;

/// The correction table in eighths, for every correctionStep eighths of the difference's magnitude (Bounds.h).
using CorrectionTable = std::array<std::uint8_t, correctionEntries>;

/// Permutations (Workspace.h) under construction.
struct SlicePermutations {
    unsigned count;  ///< slices
    std::uint32_t* sources;
    std::uint8_t* controls;
};

/// Usage: setCut whenever the size changes; then repeatedly load blocks, decode and fetch the results.
class LaneDecoder {
public:
    LaneDecoder(const InstructionSet& instructionSet, Algorithm algorithm, const CorrectionTable& corrections);

    /// Requires a block size of the standard and at most 32 segments. A decoder must cut all blocks of a size alike: it
    /// reuses what was prepared for a size.
    void setCut(const Cut& cut);

    const Cut& cut() const
    {
        return itsCut;
    }

    const InstructionSet& instructionSet() const
    {
        return itsInstructionSet;
    }

    /// Returns how many of `blocks` blocks, 1 or more, the next load takes.
    unsigned blocksTaken(unsigned blocks) const;

    /// Loads blocksTaken(count) blocks. Returns false if a value is outside the input format: clip the blocks and load
    /// them again. Throws std::bad_alloc.
    template <class Input>
    bool load(const Streams<Input>* blocks, unsigned count);

    /// Runs passes `from` to `to` - 1 on the loaded blocks. Pass 0 is the first; a later one continues from the last
    /// call.
    void decode(unsigned from, unsigned to);

    /// The results of the last pass, K values for each block, in the order of the pass's constituent decoder:
    /// decisions, 0 or 1; ratios, aligned words; the input of the next pass, aligned words: half of the extrinsic
    /// value, rounded down to an eighth, plus the systematic value.
    void decisions(std::uint8_t* const* blocks);
    void ratios(std::int16_t* const* blocks);
    void joint(std::int16_t* const* blocks);

    /// The clipped input of a block, as last loaded.
    LoadedBlock loadedBlock(unsigned block) const;

private:
    static constexpr unsigned mostSteps = 768;
    static constexpr unsigned mostLanes = 64;

    /// The tail values of a block, three streams position by position.
    using TailValues = std::array<int, rules::tailValues>;

    /// The block of a lane's segment, and the segment's first position in it.
    struct LaneStart {
        unsigned block;
        unsigned position;
    };

    /// The working memory of one kernel for one block size.
    struct Work {
        unsigned blockSize = 0;  ///< 0: none
        std::vector<unsigned char> storage;
        LaneStart laneStart[mostLanes] = {};
        SlicePermutations interleaver[2] = {};
        SlicePermutations before = {};
        SlicePermutations after = {};
        std::int16_t* firstLanes = nullptr;
        std::int16_t* lastLanes = nullptr;
        Workspace space = {};
    };

    unsigned steps() const;
    LaneOrder laneOrder(const Kernel& kernel) const;
    unsigned presentBlock(unsigned block) const;
    void prepareWork(const Kernel& kernel, Work& work) const;
    std::size_t layOut(const Kernel& kernel, Work& work, unsigned char* base) const;
    void prepareInterleaver(const Kernel& kernel,
                            const SlicePermutations& permutations,
                            const std::vector<unsigned>& from) const;
    template <class SourceOf>
    void preparePermutation(const Kernel& kernel,
                            const SlicePermutations& permutations,
                            unsigned step,
                            unsigned sourceStep,
                            SourceOf sourceOf) const;
    void prepareStarts(unsigned d);

    template <class Input>
    bool fillStream(const Streams<Input>* blocks,
                    const Input* Streams<Input>::*stream,
                    unsigned s,
                    std::int16_t* slices);

    template <class Output>
    void spread(void (*spreadSlices)(const std::int16_t*, unsigned, Output* const*),
                const std::int16_t* slices,
                Output* const* blocks);

    const InstructionSet& itsInstructionSet;
    const Algorithm itsAlgorithm;
    const CorrectionTable itsCorrections;
    Cut itsCut;
    std::vector<unsigned> itsWindowStart;  ///< the first step of each window of a segment, then the segment's end
    std::vector<unsigned> itsPermutation;  ///< position i of the interleaved order is position [i] of the natural one
    std::vector<unsigned> itsInverse;
    std::vector<Work> itsWork;  ///< one for each kernel
    const Kernel* itsKernel = nullptr;
    Work* itsCurrent = nullptr;
    unsigned itsBlocks = 0;       ///< loaded
    unsigned itsLastDecoder = 0;  ///< the constituent decoder of the last pass
    std::vector<TailValues> itsTails;
};

}  // namespace morvik::lanes

#endif

// LaneDecoder: decodes blocks of one size, one lane for each segment, several blocks at once.
#ifndef MORVIK_LANES_LANEDECODER_H
#define MORVIK_LANES_LANEDECODER_H

#include <array>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <vector>

#include "Kernels.h"
#include "LaneOrder.h"
#include "rules/Cut.h"
#include "rules/Tail.h"

namespace morvik::lanes {

using rules::Cut;
using rules::tailPositions;

/// The caller's three streams of a block, K + 4 values each, at any addresses.
template <class Input>
struct Streams {
    const Input* systematic;
    const Input* parity1;
    const Input* parity2;
};

/// The three streams of a block as they were loaded.
using LoadedBlock = std::array<std::vector<std::int16_t>, 3>;

/// The correction table: eighths, by a quarter of the difference's magnitude in eighths; the last entry serves all
/// greater ones, too.
using CorrectionTable = std::array<std::uint8_t, 16>;

/// Permutations (Workspace.h) while they are prepared.
struct SlicePermutations {
    unsigned count;  ///< of slices
    std::uint32_t* sources;
    std::uint8_t* controls;
};

/// Use: setCut whenever the size changes; then, for some blocks, load, decode and fetch results.
class LaneDecoder {
public:
    LaneDecoder(const InstructionSet& instructionSet, Algorithm algorithm, const CorrectionTable& corrections);

    /// Of a block size of the standard, at most 32 segments. One decoder cuts all blocks of a size alike: what was
    /// prepared for a size is taken up again.
    void setCut(const Cut& cut);

    const Cut& cut() const
    {
        return itsCut;
    }

    const InstructionSet& instructionSet() const
    {
        return itsInstructionSet;
    }

    /// How many blocks the next load takes when there are `blocks`, 1 or more.
    unsigned blocksTaken(unsigned blocks) const;

    /// Takes as many blocks as blocksTaken says. False when a value is beyond the input format: clip the blocks and
    /// load them again. Throws std::bad_alloc.
    template <class Input>
    bool load(const Streams<Input>* blocks, unsigned count);

    /// Runs passes `from` to `to` - 1 on the loaded blocks: 0 is the first one, later ones go on where the last call
    /// ended.
    void decode(unsigned from, unsigned to);

    /// The results of the last pass, an array of K values for each block, in the order of the pass's constituent
    /// decoder: decisions, 0 or 1; ratios, aligned words; what goes to the next pass, aligned words: half of the
    /// extrinsic value, rounded down to an eighth, plus the systematic value.
    void decisions(std::uint8_t* const* blocks);
    void ratios(std::int16_t* const* blocks);
    void joint(std::int16_t* const* blocks);

    /// The input of a block, clipped, as it was loaded last.
    LoadedBlock loadedBlock(unsigned block) const;

private:
    static constexpr unsigned mostSteps = 768;
    static constexpr unsigned mostLanes = 64;

    /// The values of a block's tail, position by position, three streams.
    using TailValues = std::array<int, rules::tailValues>;

    /// Which block a lane's segment belongs to, and the segment's first position there.
    struct LaneStart {
        unsigned block;
        unsigned position;
    };

    /// The working memory of one kernel, for one block size.
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
    unsigned itsBlocks = 0;       ///< that are loaded
    unsigned itsLastDecoder = 0;  ///< whose pass was the last one
    std::vector<TailValues> itsTails;
};

}  // namespace morvik::lanes

#endif

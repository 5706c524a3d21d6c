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
#include "Layout.h"
#include "SizeTables.h"
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

    /// The tail values of a block, three streams position by position.
    using TailValues = std::array<int, rules::tailValues>;

    /// The working memory of one kernel, and its tables of the sizes so far. In all kernels of AVX-512 together, those
    /// of all 188 sizes take 3 MB for single blocks; for batches of any number of blocks 12 to 30 MB, with 8 to 2
    /// units.
    struct Work {
        std::vector<std::unique_ptr<const SizeTables>> allTables;  ///< [index of the size], where there are some
        const SizeTables* tables = nullptr;                        ///< of the size that the space is laid out for
        Layout::Storage storage;
        Workspace space = {};
    };

    unsigned steps() const;
    unsigned presentBlock(unsigned block) const;
    void prepareWork(const Kernel& kernel, Work& work) const;
    void layOut(const Kernel& kernel, Layout& layout, Workspace& space) const;
    void prepareStarts(unsigned d);

    template <class Input>
    bool fillStream(const Streams<Input>* blocks,
                    const Input* Streams<Input>::*stream,
                    unsigned s,
                    std::int16_t* slices);

    /// Writes slices to the blocks that are not null.
    template <class Output>
    void spread(void (*spreadSlices)(const std::int16_t*, unsigned, Output* const*),
                const std::int16_t* slices,
                Output* const* blocks) const;

    const InstructionSet& itsInstructionSet;
    const Algorithm itsAlgorithm;
    const CorrectionTable itsCorrections;
    Cut itsCut;
    std::vector<Work> itsWork;  ///< one for each kernel
    const Kernel* itsKernel = nullptr;
    Work* itsCurrent = nullptr;
    unsigned itsBlocks = 0;       ///< loaded
    unsigned itsLastDecoder = 0;  ///< the constituent decoder of the last pass
    std::vector<TailValues> itsTails;
};

}  // namespace morvik::lanes

#endif

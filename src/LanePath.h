// LanePath: decodes blocks with the lane-parallel decoder, with the same results as the state's components.
#ifndef MORVIK_SRC_LANEPATH_H
#define MORVIK_SRC_LANEPATH_H

#include <cstddef>
#include <cstdint>
#include <memory>
#include <tuple>
#include <vector>

#include "BlockPath.h"
#include "DecoderState.h"
#include "MissedBlocks.h"
#include "OriginalComponents.h"
#include "lanes/InstructionSets.h"
#include "lanes/LaneDecoder.h"

/// Updates the counters of the state's original decoder, and passes on the blocks that it misses.
class LanePath : public BlockPath {
public:
    LanePath(veltra_ip_morvik_v1_0_state& state,
             OriginalComponents& originals,
             MissedBlocks& missedBlocks,
             const morvik::lanes::InstructionSet& instructionSet);

    const morvik::lanes::InstructionSet& instructionSet() const;
    void setInstructionSet(const morvik::lanes::InstructionSet& instructionSet);

    unsigned take(const morvik::simulation_call::Batch& batch, std::size_t first, unsigned most) override;
    morvik::simulation_call::Status decode(unsigned iterations) override;
    morvik::simulation_call::Status countErrors(unsigned iterations,
                                                const std::uint8_t* sent,
                                                std::uint32_t* errors) override;
    std::size_t blockSize() const override;
    void decisions(std::uint8_t* to) override;
    void ratios(std::int16_t* to) override;

    /// Adds the last decoded block to the missed blocks: among blocks of one size, only its columns would remain.
    void handOverLastBlock();

    /// Discards the blocks decoded so far: none is handed over.
    void forgetBlocks();

private:
    template <class Input>
    using Blocks = std::vector<morvik::lanes::Streams<Input>>;

    void prepare(unsigned K);
    template <class Input>
    bool load(const morvik::simulation_call::Batch& batch,
              const morvik::lanes::Streams<Input>& all,
              std::size_t first,
              unsigned taken);
    void loadClipped(const morvik::simulation_call::Batch& batch, std::size_t first);
    void count(unsigned iterations);

    veltra_ip_morvik_v1_0_state& itsState;
    OriginalComponents& itsOriginals;
    MissedBlocks& itsMissedBlocks;
    const morvik::lanes::CorrectionTable itsCorrections;
    std::unique_ptr<morvik::lanes::LaneDecoder> itsLanes;
    unsigned itsTaken = 0;       ///< blocks
    unsigned itsIterations = 0;  ///< of their decode; 0: not decoded yet

    // The addresses of the blocks taken and of their results; storage is reused from call to call.
    std::tuple<Blocks<std::int32_t>, Blocks<std::int16_t>, Blocks<std::int8_t>> itsBlocks;
    std::vector<std::uint8_t*> itsDecisions;
    std::vector<std::int16_t*> itsRatios;
};

#endif

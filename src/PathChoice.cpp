// PathChoice: selects the path, lanes or components, of a state's next blocks.
#include "PathChoice.h"

#include <typeinfo>

namespace {

/// Whether a test bench traces or presets values that the lanes do not have.
bool isWatched(const TDecoder& decoder)
{
    return decoder.itsDumpCount != 0 || decoder.itsTraceLevel != 0 || !decoder.itsExtrinsicIn.empty();
}

}  // namespace

PathChoice::PathChoice(State& state, const morvik::lanes::InstructionSet& instructionSet)
    : itsState(state),
      itsOriginals(state),
      itsMissedBlocks(itsOriginals),
      itsLanes(state, itsOriginals, itsMissedBlocks, instructionSet)
{
}

LanePath* PathChoice::lanesFor(unsigned K)
{
    if (itsComponentsAreWanted || !itsOriginals.areIn(itsState) || isWatched(*itsState.decoder) ||
        !itsState.interleaver->valid(K)) {
        return nullptr;
    }
    itsOriginals.dropTablesOfOtherSizes(K);
    if (!itsOriginals.haveOwnTables(K)) {
        return nullptr;
    }
    forgetBlocksOfOthers();
    return &itsLanes;
}

void PathChoice::catchUp()
{
    forgetBlocksOfOthers();
    itsLanes.handOverLastBlock();
    itsMissedBlocks.computeColumns();
}

/// If a test bench has replaced the decoder, the new one has not decoded these blocks, even at the same address.
void PathChoice::forgetBlocksOfOthers()
{
    if (itsState.decoder != &itsOriginals.decoder() || typeid(*itsState.decoder) != typeid(TDecoder3GPU) ||
        itsState.decoder->itsDecodeCount == 0) {
        itsMissedBlocks.forget();
        itsLanes.forgetBlocks();
    }
}

const morvik::lanes::InstructionSet* PathChoice::instructionSet() const
{
    return !itsComponentsAreWanted && itsOriginals.areIn(itsState) ? &itsLanes.instructionSet() : nullptr;
}

void PathChoice::useLanes(const morvik::lanes::InstructionSet& instructionSet)
{
    itsLanes.setInstructionSet(instructionSet);
    itsComponentsAreWanted = false;
}

void PathChoice::useComponents()
{
    itsComponentsAreWanted = true;
}

// PathChoice: selects the path, lanes or components, of a state's next blocks.
#ifndef MORVIK_SRC_PATHCHOICE_H
#define MORVIK_SRC_PATHCHOICE_H

#include "LanePath.h"
#include "MissedBlocks.h"
#include "OriginalComponents.h"

class PathChoice {
public:
    using State = veltra_ip_morvik_v1_0_state;

    /// Requires a state whose components have just been created and that outlives this object.
    PathChoice(State& state, const morvik::lanes::InstructionSet& instructionSet);

    /// Returns the lanes, ready for blocks of K bits; null if the components must decode: they are traced, changed or
    /// requested, or K is not a block size. Throws std::bad_alloc.
    LanePath* lanesFor(unsigned K);

    /// Sets the decoder's metric columns as if it had decoded every block itself.
    void catchUp();

    /// The instruction set of the lanes; null while the components are requested or changed.
    const morvik::lanes::InstructionSet* instructionSet() const;
    void useLanes(const morvik::lanes::InstructionSet& instructionSet);
    void useComponents();

private:
    void forgetBlocksOfOthers();

    State& itsState;
    OriginalComponents itsOriginals;
    MissedBlocks itsMissedBlocks;
    LanePath itsLanes;
    bool itsComponentsAreWanted = false;  ///< even where the lanes could decode
};

#endif

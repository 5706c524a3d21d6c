// PathChoice: which of its two paths the next blocks of a state take.
#ifndef MORVIK_SRC_PATHCHOICE_H
#define MORVIK_SRC_PATHCHOICE_H

#include "LanePath.h"
#include "MissedBlocks.h"
#include "OriginalComponents.h"

class PathChoice {
public:
    using State = veltra_ip_morvik_v1_0_state;

    /// For a state whose components have just been made; it must outlive this.
    PathChoice(State& state, const lanes::InstructionSet& instructionSet);

    /// The lanes, where they decode a block of K bits as the state's components would and nobody watches those;
    /// null where the components have to. Exhausted memory throws std::bad_alloc.
    LanePath* lanesFor(unsigned K);

    /// Leaves the decoder's metric columns as they would be had it decoded everything itself.
    void catchUp();

    /// What the lanes are computed with; null where the components have to decode for want of their own originals,
    /// or have been asked for.
    const lanes::InstructionSet* instructionSet() const;
    void useLanes(const lanes::InstructionSet& instructionSet);
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

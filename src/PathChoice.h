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
    PathChoice(State& state, const morvik::lanes::InstructionSet& instructionSet);

    /// The lanes, ready for blocks of K bits; null where the components have to decode: somebody watches them, has
    /// changed them or asks for them, or K is no block size. Exhausted memory throws std::bad_alloc.
    LanePath* lanesFor(unsigned K);

    /// Makes the decoder's metric columns what they would be had it decoded every block itself.
    void catchUp();

    /// What the lanes run on; null while the components are asked for or changed.
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

// InstructionSetNames: the ways to compute that the C interface names (include/morvik_v1_0_batch.h).
#ifndef MORVIK_SRC_INSTRUCTIONSETNAMES_H
#define MORVIK_SRC_INSTRUCTIONSETNAMES_H

namespace morvik {

/// The components of the model, one by one.
constexpr const char* byComponents = "component";

/// All names, on whatever machine: the instruction sets of the lanes, the best one first, then the components.
constexpr const char* instructionSetNames[] = {
#define MORVIK_INSTRUCTION_SET(name, flags, isAvailable) #name,
#define MORVIK_X86_INSTRUCTION_SET MORVIK_INSTRUCTION_SET
#include "lanes/InstructionSets.def"
    byComponents};

}  // namespace morvik

#endif

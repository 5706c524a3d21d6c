// InstructionSetNames: the instruction set names of the C interface (include/morvik_v1_0_batch.h).
#ifndef MORVIK_SRC_INSTRUCTIONSETNAMES_H
#define MORVIK_SRC_INSTRUCTIONSETNAMES_H

namespace morvik {

/// Block by block, through the model's components.
constexpr const char* byComponents = "component";

/// All names, on any machine: the instruction sets of the lanes, best first, then the components.
constexpr const char* instructionSetNames[] = {
#define MORVIK_INSTRUCTION_SET(name, flags, isAvailable) #name,
#define MORVIK_X86_INSTRUCTION_SET MORVIK_INSTRUCTION_SET
#define MORVIK_ARM_INSTRUCTION_SET MORVIK_INSTRUCTION_SET
#include "lanes/InstructionSets.def"
    byComponents};

}  // namespace morvik

#endif

// DecoderState: the struct behind the opaque pointer of the C interface.
#ifndef MORVIK_SRC_DECODERSTATE_H
#define MORVIK_SRC_DECODERSTATE_H

#include <cstdint>

#include "TCalculationEngine.h"
#include "TDecoder.h"
#include "TInterleaver.h"
#include "TNumberFormat.h"
#include "morvik_v1_0_bitacc_cmodel.h"

class PathChoice;

/// A decoder state. Owns its six components, which refer to each other by raw pointers. Allocated by
/// malloc, released by free.
struct veltra_ip_morvik_v1_0_state {
    veltra_ip_morvik_v1_0_generics generics;
    TDecoder* decoder;
    TInterleaver* interleaver;
    TCalculationEngine* engine;
    TNumberFormat* state_format;
    TNumberFormat* input_format;
    TNumberFormat* branch_format;
    bool saturation_reported;      ///< whether the saturation warning has been given
    bool tag_truncation_reported;  ///< whether the tag truncation warning has been given
    std::uint32_t tag_mask;        ///< the tag bits that are kept
    PathChoice* path_choice;       ///< null if a test bench filled in its own components, which then decode
};

#endif

// TransportDoctor: diagnoses why transport blocks decode badly.
#ifndef MORVIK_APP_DOCTOR_TRANSPORTDOCTOR_H
#define MORVIK_APP_DOCTOR_TRANSPORTDOCTOR_H

#include <cstdint>
#include <string>

#include "TransportOptions.h"
#include "hardware/diagnosis/Diagnosis.h"
#include "hardware/testbench/DecoderOptions.h"

namespace morvik {

struct TransportDoctorOptions {
    std::string input;
    std::string reference;  ///< empty if only CRCs tell what is right
    std::uint32_t blocks = 0;
    bool json = false;
    DecoderOptions decoder;
    std::uint32_t bits = 0;  ///< of a transport block
    TransportOptions transport;
    float scale = 1;
};

/// Runs `morvik doctor --transport-block-size`; returns the exit status.
int examineTransportBlocks(const TransportDoctorOptions& options);

/// The exit status of a verdict, where some mistakes were found or none.
int statusOf(diagnosis::Verdict verdict, unsigned mistakes);

}  // namespace morvik

#endif

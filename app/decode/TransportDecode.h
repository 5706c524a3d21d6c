// TransportDecode: decodes transport blocks from the soft values of their coded bits.
#ifndef MORVIK_APP_DECODE_TRANSPORTDECODE_H
#define MORVIK_APP_DECODE_TRANSPORTDECODE_H

#include <cstdint>
#include <optional>
#include <string>

#include "TransportOptions.h"
#include "base/OutputFile.h"
#include "hardware/testbench/DecoderOptions.h"

namespace morvik {

struct TransportDecodeOptions {
    std::string input;
    std::string output;
    std::optional<std::string> reference;
    std::optional<std::string> crcFile;
    DecoderOptions decoder;
    std::uint32_t bits = 0;  ///< of a transport block
    TransportOptions transport;
    float scale = 1;
    std::uint32_t softBufferBits = 0;  ///< 0: full width
};

/// Runs `morvik decode --transport-block-size`; returns the exit status.
int decodeTransportBlocks(const TransportDecodeOptions& options);

}  // namespace morvik

#endif

// Decoder: the C interface of the model as a C++ object.
#ifndef MORVIK_HARDWARE_TESTBENCH_DECODER_H
#define MORVIK_HARDWARE_TESTBENCH_DECODER_H

#include <cstdint>
#include <memory>
#include <ostream>
#include <stdexcept>
#include <string>
#include <vector>

#include "SoftBlock.h"
#include "morvik_v1_0_bitacc_cmodel.h"

class TDecoder;

namespace morvik {

/// The library refused; what() is the line that says why.
class Refusal : public std::runtime_error {
public:
    using std::runtime_error::runtime_error;
};

/// What a block decodes to.
struct Decoded {
    std::vector<std::uint8_t> bits;    ///< each 0 or 1
    std::vector<std::int16_t> ratios;  ///< log-likelihood ratios of the last pass, as morvik_v1_0_batch.h gives them
    std::uint32_t tag = 0;             ///< as the core carries it
};

/// A decoder, whose warnings and traces go to a stream of the caller's choice.
///
/// The library writes to std::cout and std::cerr. Each call redirects the first to `messages`, the second into the text
/// of a Refusal. If `messages` cannot be written, its badbit is set.
class Decoder {
public:
    /// Throws Refusal if the generics are not allowed. `messages` must outlive the decoder.
    Decoder(const veltra_ip_morvik_v1_0_generics& generics, std::ostream& messages);

    /// Selects another instruction set, by its name in morvik_v1_0_batch.h. Throws Refusal.
    void useInstructionSet(const std::string& name);

    /// Traces the next `passes` half-iterations, counted across blocks.
    void armTrace(std::uint32_t passes);

    /// Decodes a block into `bits`, one element of 0 or 1 for each bit. Throws Refusal.
    void decode(const SoftBlock& block, std::uint32_t iterations, std::uint32_t tag, std::vector<std::uint8_t>& bits);

    /// Decodes a block of at least one bit, with its ratios. Throws Refusal.
    Decoded decodeWithRatios(const SoftBlock& block, std::uint32_t iterations, std::uint32_t tag);

    /// The component that decodes, for test benches to observe. After this call it decodes every block.
    TDecoder& component();

private:
    struct Destroy {
        void operator()(veltra_ip_morvik_v1_0_state* state) const;
    };

    std::ostream& itsMessages;
    std::unique_ptr<veltra_ip_morvik_v1_0_state, Destroy> itsState;
};

}  // namespace morvik

#endif

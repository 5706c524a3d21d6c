// Decoder: the C interface of the model as a C++ object.
#include "Decoder.h"

#include <iostream>
#include <mutex>
#include <sstream>
#include <string>

#include "base/OutputTurn.h"
#include "morvik_v1_0_batch.h"
#include "src/DecoderState.h"

namespace morvik {

namespace {

/// Redirects the process's two output streams during its lifetime.
class Redirection {
public:
    explicit Redirection(std::ostream& messages)
        : itsTurn(base::outputTurn()),
          itsMessages(messages),
          itsOutput(std::cout.rdbuf(messages.rdbuf())),
          itsError(std::cerr.rdbuf(&itsErrors))
    {
    }

    Redirection(const Redirection&) = delete;
    Redirection& operator=(const Redirection&) = delete;

    ~Redirection()
    {
        const bool written = std::cout.good();
        std::cout.rdbuf(itsOutput);  // also clears the stream's state, as does the next line
        std::cerr.rdbuf(itsError);
        if (!written) {
            itsMessages.setstate(std::ios::badbit);
        }
    }

    /// What went to the standard error stream, without the end of its last line.
    std::string errors() const
    {
        std::string text = itsErrors.str();
        if (!text.empty() && text.back() == '\n') {
            text.pop_back();
        }
        return text;
    }

private:
    std::lock_guard<std::mutex> itsTurn;
    std::ostream& itsMessages;
    std::stringbuf itsErrors;
    std::streambuf* itsOutput;
    std::streambuf* itsError;
};

}  // namespace

Decoder::Decoder(const veltra_ip_morvik_v1_0_generics& generics, std::ostream& messages) : itsMessages(messages)
{
    const Redirection redirection(itsMessages);
    itsState.reset(veltra_ip_morvik_v1_0_create_state(generics));
    if (!itsState) {
        throw Refusal(redirection.errors());
    }
}

void Decoder::useInstructionSet(const std::string& name)
{
    const Redirection redirection(itsMessages);
    if (veltra_ip_morvik_v1_0_set_instruction_set(itsState.get(), name.c_str()) != 0) {
        throw Refusal(redirection.errors());
    }
}

void Decoder::armTrace(std::uint32_t passes)
{
    veltra_ip_morvik_v1_0_bitacc_dump_config(itsState.get(), passes);
}

void Decoder::decode(const SoftBlock& block,
                     std::uint32_t iterations,
                     std::uint32_t tag,
                     std::vector<std::uint8_t>& bits)
{
    bits.resize(block.size());
    veltra_ip_morvik_v1_0_outputs outputs{};
    outputs.dout = bits.data();
    outputs.dout_alloc = static_cast<std::uint32_t>(bits.size());

    const Redirection redirection(itsMessages);
    const auto status = veltra_ip_morvik_v1_0_bitacc_simulate(itsState.get(),
                                                              block.rsc1Sys.data(),
                                                              block.rsc1Par.data(),
                                                              block.rsc2Par.data(),
                                                              static_cast<std::int32_t>(block.size()),
                                                              iterations,
                                                              tag,
                                                              &outputs);
    if (status != 0) {
        throw Refusal(redirection.errors());
    }
    bits.resize(outputs.dout_size);
}

Decoded Decoder::decodeWithRatios(const SoftBlock& block, std::uint32_t iterations, std::uint32_t tag)
{
    Decoded decoded;
    decoded.bits.resize(block.size() - rules::tailPositions);
    decoded.ratios.resize(decoded.bits.size());
    veltra_ip_morvik_v1_0_batch_outputs outputs{};
    outputs.dout = decoded.bits.data();
    outputs.dout_alloc = decoded.bits.size();
    outputs.ratios = decoded.ratios.data();
    outputs.ratios_alloc = decoded.ratios.size();
    outputs.tags = &decoded.tag;
    outputs.tags_alloc = 1;

    const Redirection redirection(itsMessages);
    const auto status = veltra_ip_morvik_v1_0_batch_simulate_i32(itsState.get(),
                                                                 block.rsc1Sys.data(),
                                                                 block.rsc1Par.data(),
                                                                 block.rsc2Par.data(),
                                                                 static_cast<std::int32_t>(block.size()),
                                                                 1,
                                                                 iterations,
                                                                 &tag,
                                                                 &outputs);
    if (status != 0) {
        throw Refusal(redirection.errors());
    }
    return decoded;
}

TDecoder& Decoder::component()
{
    useInstructionSet("component");
    return *itsState->decoder;
}

void Decoder::Destroy::operator()(veltra_ip_morvik_v1_0_state* state) const
{
    veltra_ip_morvik_v1_0_destroy_state(state);
}

}  // namespace morvik

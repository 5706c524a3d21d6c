// LossDecoders: the decoders from the floating-point reference to the hardware, each a step further.
#include "LossDecoders.h"

#include <algorithm>
#include <stdexcept>

#include "link/coding/SoftValues.h"
#include "morvik_v1_0_batch.h"
#include "rules/Tail.h"

namespace morvik::validation {

namespace {

constexpr unsigned atOnce = ReceivedBlocks::atOnce;
constexpr float fillerRatio = -1e4F;  // filler bits are known to be 0

veltra_ip_morvik_v1_0_state* twoUnits()
{
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = 2;
    generics.C_ALGORITHM_TYPE = scaledAlgorithm;
    return veltra_ip_morvik_v1_0_create_state(generics);
}

}  // namespace

void LossDecoders::Destroy::operator()(veltra_ip_morvik_v1_0_state* state) const
{
    veltra_ip_morvik_v1_0_destroy_state(state);
}

LossDecoders::LossDecoders(const link::TransportBlockCode& code,
                           const std::vector<std::string>& chosen,
                           float scale,
                           unsigned iterations)
    : itsMatching(code.matching(0)),
      itsK(code.blocks().size(0)),
      itsFillers(code.blocks().fillers),
      itsNames(chosen),
      itsScale(scale),
      itsIterations(iterations),
      itsFloat(itsK),
      itsUndivided(variantOf("undivided"), scaledAlgorithm),
      itsHardware(twoUnits())
{
}

std::vector<bool> LossDecoders::failures(std::size_t i, const ReceivedBlocks& blocks)
{
    const std::string& name = itsNames[i];
    const Streams streams = softValuesOf(blocks);
    const Decisions decisions = name == "reference"   ? decideReference(blocks)
                                : name == "input"     ? decideInput(streams)
                                : name == "undivided" ? decideUndivided(streams)
                                                      : decideHardware(streams);
    const auto fillers = static_cast<std::ptrdiff_t>(itsFillers);
    std::vector<bool> failed;
    for (unsigned b = 0; b < atOnce; ++b) {
        const std::vector<unsigned char>& sent = blocks.sent(b);
        failed.push_back(!std::equal(sent.begin() + fillers, sent.end(), decisions[b].begin() + fillers));
    }
    return failed;
}

LossDecoders::Streams LossDecoders::softValuesOf(const ReceivedBlocks& blocks) const
{
    const std::size_t length = itsK + rules::tailPositions;
    Streams streams;
    for (auto& stream : streams) {
        stream.resize(atOnce * length);
    }
    std::vector<std::int8_t> values(itsMatching.size());
    for (std::size_t b = 0; b < atOnce; ++b) {
        link::softValues(blocks.buffer(static_cast<unsigned>(b)).data(), values.size(), itsScale, values.data());
        itsMatching.deinterleave(values.data(),
                                 link::fillerValue,
                                 {&streams[0][b * length], &streams[1][b * length], &streams[2][b * length]});
    }
    return streams;
}

LossDecoders::Decisions LossDecoders::decideReference(const ReceivedBlocks& blocks)
{
    Decisions decisions;
    for (unsigned first = 0; first < atOnce; first += FloatDecoder::blocksAtOnce) {
        decideFloat(exactRatios(blocks, first), decisions);
    }
    return decisions;
}

LossDecoders::Decisions LossDecoders::decideInput(const Streams& streams)
{
    Decisions decisions;
    for (unsigned first = 0; first < atOnce; first += FloatDecoder::blocksAtOnce) {
        decideFloat(roundedRatios(streams, first), decisions);
    }
    return decisions;
}

FloatDecoder::Received LossDecoders::exactRatios(const ReceivedBlocks& blocks, unsigned first) const
{
    const unsigned length = itsK + rules::tailPositions;
    FloatDecoder::Received received;
    for (std::size_t s = 0; s < 3; ++s) {
        received[s].assign(length, FloatDecoder::Values{});
        std::fill_n(received[s].begin(), s < 2 ? itsFillers : 0, FloatDecoder::Values{} + fillerRatio);
    }
    for (unsigned b = 0; b < FloatDecoder::blocksAtOnce; ++b) {
        const std::vector<float>& buffer = blocks.buffer(first + b);
        for (unsigned n = 0; n < buffer.size(); ++n) {
            const unsigned place = itsMatching.positions()[n];
            received[place / length][place % length][b] = buffer[n];
        }
    }
    return received;
}

FloatDecoder::Received LossDecoders::roundedRatios(const Streams& streams, unsigned first) const
{
    const std::size_t length = itsK + rules::tailPositions;
    FloatDecoder::Received received;
    for (std::size_t s = 0; s < 3; ++s) {
        received[s].resize(length);
        for (std::size_t i = 0; i < length; ++i) {
            for (std::size_t b = 0; b < FloatDecoder::blocksAtOnce; ++b) {
                received[s][i][b] = streams[s][(first + b) * length + i];
            }
        }
    }
    return received;
}

void LossDecoders::decideFloat(const FloatDecoder::Received& received, Decisions& decisions)
{
    const FloatDecoder::Stream& ratios = itsFloat.decode(received, itsIterations);
    for (std::size_t b = 0; b < FloatDecoder::blocksAtOnce; ++b) {
        std::vector<unsigned char> decided(itsK);
        for (std::size_t k = 0; k < itsK; ++k) {
            decided[k] = ratios[k][b] > 0 ? 1 : 0;
        }
        decisions.push_back(decided);
    }
}

LossDecoders::Decisions LossDecoders::decideUndivided(const Streams& streams)
{
    const std::size_t length = itsK + rules::tailPositions;
    Decisions decisions;
    std::vector<double> received(3 * length);
    for (std::size_t b = 0; b < atOnce; ++b) {
        for (std::size_t i = 0; i < received.size(); ++i) {
            received[i] = streams[i % 3][b * length + i / 3];
        }
        decisions.push_back(itsUndivided.decode(received, 1, itsIterations));
    }
    return decisions;
}

LossDecoders::Decisions LossDecoders::decideHardware(const Streams& streams)
{
    std::vector<unsigned char> bits(std::size_t{atOnce} * itsK);
    veltra_ip_morvik_v1_0_batch_outputs outputs{};
    outputs.dout = bits.data();
    outputs.dout_alloc = bits.size();
    const std::int32_t status =
        veltra_ip_morvik_v1_0_batch_simulate_i8(itsHardware.get(),
                                                streams[0].data(),
                                                streams[1].data(),
                                                streams[2].data(),
                                                static_cast<std::int32_t>(itsK + rules::tailPositions),
                                                atOnce,
                                                itsIterations,
                                                nullptr,
                                                &outputs);
    if (status != 0) {
        throw std::runtime_error("the decoder has refused a block");
    }
    Decisions decisions;
    for (std::size_t b = 0; b < atOnce; ++b) {
        decisions.emplace_back(&bits[b * itsK], &bits[b * itsK] + itsK);
    }
    return decisions;
}

}  // namespace morvik::validation

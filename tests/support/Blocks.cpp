// Blocks: seeded code blocks for tests, and a decoder for them.
#include "Blocks.h"

#include <array>
#include <cmath>
#include <memory>
#include <stdexcept>

#include "TInterleaver.h"

#include "morvik_v1_0_batch.h"

namespace morvik::blocks {

namespace {

/// A constituent encoder: a shift register of three delays, newest first.
class ConstituentEncoder {
public:
    struct Output {
        int systematic;
        int parity;
    };

    /// Feedback 1 + D^2 + D^3, feed-forward 1 + D + D^3.
    Output step(int bit)
    {
        const int fed = bit ^ itsDelay[1] ^ itsDelay[2];
        const int parity = fed ^ itsDelay[0] ^ itsDelay[2];
        itsDelay = {fed, itsDelay[0], itsDelay[1]};
        return {bit, parity};
    }

    /// Makes a step towards state 0, with the bit that cancels the feedback.
    Output terminate()
    {
        return step(itsDelay[1] ^ itsDelay[2]);
    }

private:
    std::array<int, 3> itsDelay{};
};

}  // namespace

int between(Random& random, int first, int last)
{
    const auto range = static_cast<std::uint32_t>(last - first) + 1U;
    return first + static_cast<int>(random() % range);
}

std::vector<unsigned> blockSizes()
{
    std::vector<unsigned> sizes;
    const std::unique_ptr<TInterleaver> interleaver(TInterleaver::create("3GPPLTE"));
    for (unsigned K = 1; K <= 6144; ++K) {
        if (interleaver->valid(K)) {
            sizes.push_back(K);
        }
    }
    return sizes;
}

std::vector<int> randomBits(Random& random, unsigned K)
{
    std::vector<int> bits(K);
    for (int& bit : bits) {
        bit = between(random, 0, 1);
    }
    return bits;
}

Block encode(const std::vector<int>& bits, int amplitude)
{
    const auto K = static_cast<unsigned>(bits.size());
    const std::unique_ptr<TInterleaver> interleaver(TInterleaver::create("3GPPLTE"));
    if (!interleaver->calcInterleaver(interleaver->itsPi, K)) {
        throw std::invalid_argument("no block size: " + std::to_string(K));
    }
    ConstituentEncoder first;
    ConstituentEncoder second;
    Block block;
    const auto soft = [amplitude](int bit) {
        return amplitude * (2 * bit - 1);
    };
    for (unsigned k = 0; k < K; ++k) {
        const auto natural = first.step(bits[k]);
        block.sys.push_back(soft(natural.systematic));
        block.par1.push_back(soft(natural.parity));
        block.par2.push_back(soft(second.step(bits[interleaver->itsPi[k]]).parity));
    }
    // Each encoder ends with x z x z x z, written over the three streams position by position.
    for (ConstituentEncoder* encoder : {&first, &second}) {
        std::vector<int> tail;
        for (unsigned step = 0; step < 3; ++step) {
            const auto output = encoder->terminate();
            tail.push_back(soft(output.systematic));
            tail.push_back(soft(output.parity));
        }
        for (const std::size_t position : {0U, 1U}) {
            block.sys.push_back(tail[3 * position]);
            block.par1.push_back(tail[3 * position + 1]);
            block.par2.push_back(tail[3 * position + 2]);
        }
    }
    return block;
}

void addNoise(Random& random, double deviation, Block& block)
{
    for (Stream* stream : {&block.sys, &block.par1, &block.par2}) {
        for (std::int32_t& value : *stream) {
            int sum = 0;  // of four numbers of variance (2^16)^2 / 12
            for (unsigned i = 0; i < 4; ++i) {
                sum += between(random, -32768, 32767);
            }
            value += static_cast<std::int32_t>(std::lround(deviation * sum / 37837.0));
        }
    }
}

Block randomBlock(Random& random, unsigned K, Values values)
{
    const auto draw = [&]() -> std::int32_t {
        switch (values) {
        case Values::uniform:
            return between(random, -128, 127);
        case Values::extreme:
            return between(random, 0, 1) == 0 ? -128 : 127;
        case Values::small:
            return between(random, -2, 2);
        case Values::saturating:
            break;
        }
        return static_cast<std::int32_t>(random()) >> between(random, 0, 24);
    };
    Block block;
    for (Stream* stream : {&block.sys, &block.par1, &block.par2}) {
        for (unsigned i = 0; i < K + 4; ++i) {
            stream->push_back(draw());
        }
    }
    return block;
}

Decoder::Decoder(int units, int algorithm, int tagWidth) : itsState(nullptr)
{
    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = units;
    generics.C_ALGORITHM_TYPE = algorithm;
    generics.C_TAG_WIDTH = tagWidth;
    itsState = veltra_ip_morvik_v1_0_create_state(generics);
    if (itsState == nullptr) {
        throw std::invalid_argument("the generics were refused");
    }
}

Decoder::~Decoder()
{
    veltra_ip_morvik_v1_0_destroy_state(itsState);
}

void Decoder::decodeByComponents()
{
    veltra_ip_morvik_v1_0_set_instruction_set(itsState, "component");
}

Decoder::Result Decoder::decode(const Block& block, unsigned iterations, std::uint32_t tag)
{
    const auto positions = static_cast<std::int32_t>(block.sys.size());
    std::vector<std::uint8_t> bits(block.sys.size());
    veltra_ip_morvik_v1_0_outputs outputs{bits.data(), static_cast<std::uint32_t>(bits.size()), 0, 0};
    const int status = veltra_ip_morvik_v1_0_bitacc_simulate(
        itsState, block.sys.data(), block.par1.data(), block.par2.data(), positions, iterations, tag, &outputs);
    bits.resize(outputs.dout_size);
    return {status, bits, outputs.tag};
}

}  // namespace morvik::blocks

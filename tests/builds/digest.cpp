// digest: one number for all decisions, log-likelihood ratios, extrinsic values and traces of some
// hundred random blocks. Every compiler, optimisation and word size must give the same.
//
// Prints the number; with an argument, compares it and exits with 1 when it differs.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <vector>

#include "DecoderState.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"

namespace {

/// FNV-1a, 64 bits.
class Digest {
public:
    void add(const void* data, std::size_t size)
    {
        const auto* bytes = static_cast<const unsigned char*>(data);
        for (std::size_t i = 0; i < size; ++i) {
            itsValue = (itsValue ^ bytes[i]) * 0x100000001B3ULL;
        }
    }

    /// 16-bit values, byte by byte, low byte first.
    void add(const std::vector<short>& values, std::size_t count)
    {
        for (std::size_t i = 0; i < count; ++i) {
            const auto word = static_cast<std::uint16_t>(values[i]);
            const unsigned char bytes[2] = {static_cast<unsigned char>(word & 0xFF),
                                            static_cast<unsigned char>(word >> 8)};
            add(bytes, sizeof bytes);
        }
    }

    std::string text() const
    {
        char digits[17];
        std::snprintf(digits, sizeof digits, "%016llx", static_cast<unsigned long long>(itsValue));
        return digits;
    }

private:
    std::uint64_t itsValue = 0xCBF29CE484222325ULL;
};

void addBlock(Digest& digest,
              morvik::blocks::Random& random,
              morvik::blocks::Decoder& decoder,
              morvik::blocks::Decoder& lanes,
              unsigned K)
{
    const auto values = static_cast<morvik::blocks::Values>(morvik::blocks::between(random, 0, 3));
    const auto iterations = static_cast<unsigned>(morvik::blocks::between(random, 1, 4));
    const morvik::blocks::Block block = morvik::blocks::randomBlock(random, K, values);
    CapturedStreams streams;
    const bool traced = K < 200 && morvik::blocks::between(random, 0, 7) == 0;
    veltra_ip_morvik_v1_0_bitacc_dump_config(decoder.state(), traced ? 2 : 0);
    const auto result = decoder.decode(block, iterations);
    const std::string text = streams.out() + streams.err();
    if (lanes.decode(block, iterations).bits != result.bits) {
        std::puts("The lanes decide otherwise");
        std::exit(1);
    }
    digest.add(result.bits.data(), result.bits.size());
    digest.add(decoder.state()->decoder->itsLLR, K);
    digest.add(decoder.state()->decoder->itsExtrinsic, K);
    digest.add(text.data(), text.size());
}

}  // namespace

int main(int argc, char** argv)
{
    Digest digest;
    morvik::blocks::Random random(36212);
    const std::vector<unsigned> sizes = morvik::blocks::blockSizes();
    for (const int units : {2, 4, 8}) {
        for (const int algorithm : {0, 1, 2}) {
            morvik::blocks::Decoder decoder(units, algorithm);
            morvik::blocks::Decoder lanes(units, algorithm);
            decoder.decodeByComponents();
            for (unsigned i = 0; i < 36; ++i) {
                const int last = i % 12 == 0 ? 187 : 70;  // most are small, some of any size
                addBlock(digest,
                         random,
                         decoder,
                         lanes,
                         sizes[static_cast<std::size_t>(morvik::blocks::between(random, 0, last))]);
            }
        }
    }
    std::puts(digest.text().c_str());
    return argc > 1 && digest.text() != argv[1] ? 1 : 0;
}

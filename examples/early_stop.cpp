// Stops decoding a block as soon as its CRC is right, as receivers do. The core runs all requested iterations, so the
// remaining blocks are decoded again, with one more iteration.
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <memory>
#include <random>
#include <vector>

#include "morvik_v1_0_batch.h"

namespace {

constexpr std::size_t K = 1024;
constexpr unsigned mostIterations = 8;

using Block = std::vector<std::int8_t>;  // one stream, K + 4 soft values
struct Received {
    std::vector<Block> sys, par1, par2;
};

/// Bits 0, sent as -8 over a channel with a noise standard deviation of 9.2: a sum of four bytes is close
/// enough to a Gaussian value, and the same everywhere.
Block receive(std::mt19937& random)
{
    Block values(K + 4);
    for (std::int8_t& value : values) {
        const std::uint32_t bytes = static_cast<std::uint32_t>(random());
        const int sum = int(bytes & 255) + int(bytes >> 8 & 255) + int(bytes >> 16 & 255) + int(bytes >> 24);
        value = static_cast<std::int8_t>(-8 + (sum / 2 - 255) / 8);
    }
    return values;
}

/// Whether the last 24 of K bits are the CRC of those before: gCRC24B of 3GPP TS 36.212, clause 5.1.1. A block of zeros
/// has a valid CRC.
bool crcIsRight(const std::uint8_t* bits)
{
    std::uint32_t remainder = 0;
    for (std::size_t i = 0; i < K; ++i) {
        remainder = remainder << 1 | bits[i];
        if (remainder >> 24 != 0) {
            remainder ^= 0x1800063;
        }
    }
    return remainder == 0;
}

/// A stream of several consecutive blocks, as the batch interface takes them.
Block joined(const std::vector<Block>& stream, const std::vector<std::size_t>& chosen)
{
    Block values;
    for (const std::size_t b : chosen) {
        values.insert(values.end(), stream[b].begin(), stream[b].end());
    }
    return values;
}

struct Decoded {
    std::vector<std::uint8_t> bits;
    std::vector<std::int16_t> ratios;
};

Decoded decode(veltra_ip_morvik_v1_0_state* state,
               const Received& received,
               const std::vector<std::size_t>& chosen,
               unsigned iterations)
{
    Decoded decoded = {std::vector<std::uint8_t>(chosen.size() * K), std::vector<std::int16_t>(chosen.size() * K)};
    veltra_ip_morvik_v1_0_batch_outputs outputs = {};
    outputs.dout = decoded.bits.data();
    outputs.dout_alloc = decoded.bits.size();
    outputs.ratios = decoded.ratios.data();
    outputs.ratios_alloc = decoded.ratios.size();
    if (veltra_ip_morvik_v1_0_batch_simulate_i8(state,
                                                joined(received.sys, chosen).data(),
                                                joined(received.par1, chosen).data(),
                                                joined(received.par2, chosen).data(),
                                                K + 4,
                                                static_cast<std::uint32_t>(chosen.size()),
                                                iterations,
                                                nullptr,
                                                &outputs) != 0) {
        std::exit(1);  // the reason is on standard error
    }
    return decoded;
}

/// Number of decisions in a block with a ratio between -4 and 4.
unsigned doubtful(const std::int16_t* ratios)
{
    unsigned count = 0;
    for (std::size_t i = 0; i < K; ++i) {
        count += std::abs(ratios[i]) < 4 * 128;
    }
    return count;
}

}  // namespace

int main()
{
    std::mt19937 random(1);
    Received received;
    std::vector<std::size_t> left;
    for (std::size_t b = 0; b < 200; ++b) {
        received.sys.push_back(receive(random));
        received.par1.push_back(receive(random));
        received.par2.push_back(receive(random));
        left.push_back(b);
    }

    veltra_ip_morvik_v1_0_generics generics = veltra_ip_morvik_v1_0_get_default_generics();
    generics.C_NUM_PU = 4;
    const std::unique_ptr<veltra_ip_morvik_v1_0_state, decltype(&veltra_ip_morvik_v1_0_destroy_state)> state(
        veltra_ip_morvik_v1_0_create_state(generics), veltra_ip_morvik_v1_0_destroy_state);
    if (state == nullptr) {
        return 1;
    }

    std::size_t iterationsRun = 0;
    for (unsigned n = 1; n <= mostIterations && !left.empty(); ++n) {
        iterationsRun += left.size();
        const Decoded decoded = decode(state.get(), received, left, n);
        std::vector<std::size_t> wrong;
        unsigned doubts = 0;
        for (std::size_t i = 0; i < left.size(); ++i) {
            if (!crcIsRight(&decoded.bits[i * K])) {
                wrong.push_back(left[i]);
                doubts += doubtful(&decoded.ratios[i * K]);
            }
        }
        std::printf("iteration %u: %3zu blocks right, %3zu left", n, left.size() - wrong.size(), wrong.size());
        if (!wrong.empty()) {
            std::printf(", with %3zu doubtful decisions each", doubts / wrong.size());
        }
        std::printf("\n");
        left = wrong;
    }
    std::printf("%.2f iterations for a block instead of %u\n", double(iterationsRun) / 200, mostIterations);
}

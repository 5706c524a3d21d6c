// link_fuzz: the C interface of the LTE chain takes any arguments: it refuses them and writes nothing, or what it sends
// is what it receives.
#include <algorithm>
#include <cmath>
#include <cstring>
#include <vector>

#include "FuzzInput.h"
#include "morvik_link.h"

namespace {

using Bytes = std::vector<std::uint8_t>;

/// Sizes are small, so that many inputs are tried in a second.
std::uint32_t size(FuzzInput& input)
{
    return input.word() % 3000;
}

Bytes bits(FuzzInput& input, std::size_t count)
{
    Bytes made(count);
    std::uint32_t state = input.word();
    for (std::uint8_t& bit : made) {
        state = state * 1664525U + 1013904223U;
        bit = static_cast<std::uint8_t>(state >> 31);
    }
    return made;
}

/// +1 for each 1 and -1 for each 0.
std::vector<float> ratiosOf(const Bytes& coded)
{
    std::vector<float> ratios(coded.size());
    std::transform(
        coded.begin(), coded.end(), ratios.begin(), [](std::uint8_t bit) { return bit != 0 ? 1.0F : -1.0F; });
    return ratios;
}

void matchAndRecover(FuzzInput& input)
{
    const std::uint32_t K = input.below(2) == 0 ? size(input) : 40 + 8 * input.below(60);
    const std::uint32_t fillers = input.below(80);
    const std::uint32_t bufferSize = input.below(2) == 0 ? 0 : size(input);
    const std::uint32_t version = input.below(5);
    const std::size_t count = size(input);
    const std::size_t length = std::size_t{K} + 4;
    const Bytes sys = bits(input, length);
    Bytes coded(count, 7);
    std::uint32_t values = 0;
    const std::int32_t status = morvik_link_rate_match(
        K, fillers, bufferSize, version, 1, sys.data(), sys.data(), sys.data(), count, coded.data());
    if (status != MORVIK_LINK_OK) {
        require(std::all_of(coded.begin(), coded.end(), [](std::uint8_t bit) { return bit == 7; }),
                "a refusal writes nothing");
        return;
    }
    require(morvik_link_soft_buffer_size(K, fillers, bufferSize, &values) == MORVIK_LINK_OK, "there is a soft buffer");
    std::vector<float> buffer(values);
    const std::vector<float> ratios = ratiosOf(coded);
    require(morvik_link_rate_recover(K, fillers, bufferSize, version, 1, ratios.data(), count, buffer.data()) ==
                MORVIK_LINK_OK,
            "what was sent is received");
    std::vector<float> streams(3 * length);
    float* const first = streams.data();
    require(
        morvik_link_deinterleave(
            K, fillers, bufferSize, 1, buffer.data(), -1, first, first + length, first + 2 * length) == MORVIK_LINK_OK,
        "what was received is put in order");
    for (std::size_t i = 0; i < streams.size(); ++i) {
        const bool filler = i < 2 * length && i % length < fillers;
        const bool one = !filler && sys[i % length] != 0;
        require(streams[i] == 0 || (streams[i] > 0) == one, "a received value has the sign of its bit");
    }
}

void transport(FuzzInput& input)
{
    const morvik_link_format format = {size(input) * (input.below(8) == 0 ? 7 : 1),
                                       size(input) * (1 + input.below(8)),
                                       input.below(10),
                                       input.below(6),
                                       input.below(2) == 0 ? 0 : size(input)};
    morvik_link_transport* made = nullptr;
    const std::int32_t status = morvik_link_transport_create(&format, &made);
    require((status == MORVIK_LINK_OK) == (made != nullptr), "a refusal makes nothing");
    require(std::strcmp(morvik_link_status_text(status), "unknown status") != 0, "every status has a text");
    if (made == nullptr) {
        return;
    }
    const Bytes sent = bits(input, format.transport_block_size);
    Bytes coded(format.coded_bits, 7);
    const std::uint32_t version = input.below(5);
    if (morvik_link_transport_encode(made, version, 1, sent.data(), coded.data()) == MORVIK_LINK_OK) {
        require(std::all_of(coded.begin(), coded.end(), [](std::uint8_t bit) { return bit <= 1; }), "bits are 0 or 1");
        std::vector<float> buffer(morvik_link_transport_buffer_size(made));
        const std::vector<float> ratios = ratiosOf(coded);
        require(morvik_link_transport_recover(made, version, 1, ratios.data(), buffer.data()) == MORVIK_LINK_OK,
                "what was sent is received");
        float sum = 0;
        for (const float value : buffer) {
            sum += std::fabs(value);
        }
        require(sum == static_cast<float>(coded.size()), "every value is added once");
    }
    morvik_link_transport_destroy(made);
}

void modulate(FuzzInput& input)
{
    const std::uint32_t bitsPerSymbol = input.below(10);
    const std::int32_t demapper = static_cast<std::int32_t>(input.below(4)) - 1;
    const std::size_t count = input.below(20);
    const Bytes sent = bits(input, count * bitsPerSymbol);
    std::vector<float> symbols(2 * count);
    std::vector<float> ratios(sent.size());
    const bool mapped = morvik_link_map(bitsPerSymbol, sent.data(), count, symbols.data()) == MORVIK_LINK_OK;
    float noise;
    const std::uint32_t word = input.word();
    std::memcpy(&noise, &word, sizeof noise);
    const std::int32_t status =
        morvik_link_demap(bitsPerSymbol, demapper, symbols.data(), nullptr, noise, count, ratios.data());
    if (mapped && status == MORVIK_LINK_OK && noise > 1e-6F && noise < 1e3F) {
        for (std::size_t i = 0; i < sent.size(); ++i) {
            require(std::isfinite(ratios[i]), "ratios are finite");
            // In much noise, the sum of far points may decide otherwise, and ratios be rounded to 0.
            require(noise > 0.01F || (ratios[i] > 0) == (sent[i] != 0), "a ratio has the sign of its bit");
        }
    }
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    FuzzInput input(data, size);
    while (!input.empty()) {
        switch (input.below(3)) {
        case 0:
            matchAndRecover(input);
            break;
        case 1:
            transport(input);
            break;
        default:
            modulate(input);
        }
    }
    return 0;
}

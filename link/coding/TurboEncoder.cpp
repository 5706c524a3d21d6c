// TurboEncoder: the turbo encoder of 3GPP TS 36.212, clause 5.1.3.2, for up to 64 blocks at once.
#include "TurboEncoder.h"

#include <algorithm>
#include <stdexcept>
#include <string>

#include "BitMatrix.h"
#include "rules/Interleaver.h"
#include "rules/Tail.h"

namespace morvik::link {

namespace {

/// Entry i is the position, in the first encoder's order, of the second encoder's bit i.
std::vector<std::uint16_t> permutation(unsigned K)
{
    const rules::BlockSize* const row = rules::findBlockSize(K);
    if (row == nullptr) {
        throw std::invalid_argument(std::to_string(K) + " is no block size of the LTE turbo code");
    }
    std::vector<std::uint16_t> positions;
    positions.reserve(K);
    rules::InterleaverAddress address(*row);
    for (unsigned i = 0; i < K; ++i) {
        positions.push_back(static_cast<std::uint16_t>(address.next()));
    }
    return positions;
}

/// A constituent encoder of 64 blocks: feedback 1 + D^2 + D^3, parity 1 + D + D^3.
class ConstituentEncoder {
public:
    /// Takes one bit of each block and returns the parity bits.
    std::uint64_t step(std::uint64_t bits)
    {
        const std::uint64_t fed = bits ^ itsMiddle ^ itsOldest;
        const std::uint64_t parity = fed ^ itsNewest ^ itsOldest;
        itsOldest = itsMiddle;
        itsMiddle = itsNewest;
        itsNewest = fed;
        return parity;
    }

    /// The bits that cancel the feedback, so that three steps end in state 0.
    std::uint64_t terminating() const
    {
        return itsMiddle ^ itsOldest;
    }

private:
    std::uint64_t itsNewest = 0;
    std::uint64_t itsMiddle = 0;
    std::uint64_t itsOldest = 0;
};

/// The three systematic and parity bits that terminate a trellis, in transmission order.
std::array<std::uint64_t, 6> terminate(ConstituentEncoder& encoder)
{
    std::array<std::uint64_t, 6> tail{};
    for (unsigned i = 0; i < tail.size(); i += 2) {
        tail[i] = encoder.terminating();
        tail[i + 1] = encoder.step(tail[i]);
    }
    return tail;
}

}  // namespace

TurboEncoder::TurboEncoder(unsigned K)
    : itsK(K), itsWords((K + rules::tailPositions + 63) / 64), itsPermutation(permutation(K))
{
    for (Slices& slices : itsSlices) {
        slices.resize(std::size_t{64} * itsWords);
    }
}

void TurboEncoder::encode(const PackedBlocks& information, unsigned count, Streams& streams)
{
    encodeSlices(information, count);
    for (unsigned s = 0; s < streams.size(); ++s) {
        streams[s].words = itsWords;
        streams[s].bits.resize(std::size_t{count} * itsWords);
    }
    // The systematic stream equals the information, except its last word, which has the tail.
    std::copy_n(information.bits.begin(), streams[0].bits.size(), streams[0].bits.begin());
    scatter(0, itsWords - 1, count, streams[0]);
    for (unsigned word = 0; word < itsWords; ++word) {
        scatter(1, word, count, streams[1]);
        scatter(2, word, count, streams[2]);
    }
}

void TurboEncoder::encode(const PackedBlocks& information,
                          unsigned count,
                          const std::vector<std::uint16_t>& order,
                          std::uint64_t* const* rows)
{
    encodeSlices(information, count);
    const std::size_t length = itsK + rules::tailPositions;
    BitMatrix matrix;
    for (std::size_t first = 0; first < order.size(); first += matrix.size()) {
        const std::size_t now = std::min(order.size() - first, matrix.size());
        for (std::size_t i = 0; i < now; ++i) {
            const std::size_t bit = order[first + i];
            const std::size_t stream = (bit >= length ? 1U : 0U) + (bit >= 2 * length ? 1U : 0U);
            matrix[i] = itsSlices[stream][bit - stream * length];
        }
        std::fill(matrix.begin() + static_cast<std::ptrdiff_t>(now), matrix.end(), 0);
        transpose(matrix);
        for (unsigned b = 0; b < count; ++b) {
            rows[b][first / matrix.size()] = matrix[b];
        }
    }
}

/// Encodes one slice after the other.
void TurboEncoder::encodeSlices(const PackedBlocks& information, unsigned count)
{
    for (unsigned word = 0; word < itsWords; ++word) {
        gather(information, word, count);
    }
    auto& [systematic, parity1, parity2] = itsSlices;
    ConstituentEncoder first;
    ConstituentEncoder second;
    for (unsigned k = 0; k < itsK; ++k) {
        parity1[k] = first.step(systematic[k]);
        parity2[k] = second.step(systematic[itsPermutation[k]]);
    }
    // The tail is distributed over the three streams position by position, the first encoder's before the second's.
    unsigned position = itsK;
    for (ConstituentEncoder* const encoder : {&first, &second}) {
        const std::array<std::uint64_t, 6> tail = terminate(*encoder);
        for (unsigned i = 0; i < tail.size(); i += 3, ++position) {
            systematic[position] = tail[i];
            parity1[position] = tail[i + 1];
            parity2[position] = tail[i + 2];
        }
    }
}

/// Converts one word of each block to 64 slices of the systematic stream.
void TurboEncoder::gather(const PackedBlocks& information, unsigned word, unsigned count)
{
    BitMatrix matrix{};
    for (unsigned b = 0; b < count; ++b) {
        matrix[b] = information.block(b)[word];
    }
    transpose(matrix);
    std::copy(matrix.begin(), matrix.end(), &itsSlices[0][std::size_t{64} * word]);
}

/// Converts 64 slices of a stream to one word of each block.
void TurboEncoder::scatter(unsigned stream, unsigned word, unsigned count, PackedBlocks& blocks) const
{
    BitMatrix matrix;
    std::copy_n(&itsSlices[stream][std::size_t{64} * word], matrix.size(), matrix.begin());
    transpose(matrix);
    for (unsigned b = 0; b < count; ++b) {
        blocks.block(b)[word] = matrix[b];
    }
}

}  // namespace morvik::link

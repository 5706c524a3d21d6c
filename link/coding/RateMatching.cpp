// RateMatching: rate matching of one code block and its reverse: 3GPP TS 36.212, clause 5.1.4.1.
#include "RateMatching.h"

#include <algorithm>
#include <cstring>
#include <stdexcept>
#include <string>

#include "PackedBits.h"
#include "link/kernels/RowKernels.h"
#include "rules/BlockSizes.h"
#include "rules/Tail.h"

namespace morvik::link {

namespace {

/// Columns of the sub-block interleaver, and the order in which they are read: Table 5.1.4-1, the reversal of five
/// bits.
constexpr unsigned columns = 32;
constexpr std::array<std::uint8_t, columns> columnOrder = {0, 16, 8, 24, 4, 20, 12, 28, 2, 18, 10, 26, 6, 22, 14, 30,
                                                           1, 17, 9, 25, 5, 21, 13, 29, 3, 19, 11, 27, 7, 23, 15, 31};

/// Of one stream of the largest block, dummy bits included.
constexpr std::size_t mostPositions = 6176;
static_assert(mostPositions % columns == 0 &&
              mostPositions - rules::blockSizes.back().K - rules::tailPositions < columns);

constexpr std::uint16_t null = 0xFFFF;  // more than any position: three streams have at most 18444 bits

/// The circular buffer w of clause 5.1.4.1.2, with dummy and filler bits: the place of each bit in the three streams.
std::vector<std::uint16_t> circularBuffer(unsigned K, unsigned fillers)
{
    const unsigned length = K + rules::tailPositions;  // D
    const unsigned rows = (length + columns - 1) / columns;
    const unsigned size = rows * columns;
    const unsigned dummies = size - length;
    const auto place = [=](unsigned stream, unsigned written, unsigned fillersThere) {
        return written < dummies + fillersThere ? null
                                                : static_cast<std::uint16_t>(stream * length + written - dummies);
    };
    std::vector<std::uint16_t> buffer(std::size_t{3} * size);
    unsigned k = 0;
    for (const unsigned column : columnOrder) {
        for (unsigned written = column; written < size; written += columns, ++k) {
            buffer[k] = place(0, written, fillers);
            buffer[size + 2 * k] = place(1, written, fillers);
            buffer[size + 2 * k + 1] = place(2, written + 1 < size ? written + 1 : 0, 0);
        }
    }
    return buffer;
}

/// Calls `each` with every run of the circular buffer that a transmission of `count` bits goes through: its start in
/// the buffer, its start in the transmission, and its length.
template <typename Each>
void forRuns(unsigned size, unsigned start, std::size_t count, Each each)
{
    for (std::size_t done = 0; done < count;) {
        const std::size_t now = std::min<std::size_t>(count - done, size - start);
        each(start, done, now);
        done += now;
        start = 0;
    }
}

}  // namespace

RateMatching::RateMatching(unsigned K, unsigned fillers, unsigned bufferSize) : itsK(K), itsFillers(fillers), itsRows(0)
{
    if (rules::findBlockSize(K) == nullptr) {
        throw std::invalid_argument(std::to_string(K) + " is no block size of the LTE turbo code");
    }
    if (fillers >= K) {
        throw std::invalid_argument(std::to_string(fillers) + " filler bits leave none of a block of " +
                                    std::to_string(K));
    }
    std::vector<std::uint16_t> buffer = circularBuffer(K, fillers);
    itsRows = static_cast<unsigned>(buffer.size() / 3 / columns);
    if (bufferSize < buffer.size()) {
        buffer.resize(bufferSize);
    }
    const auto bitsBefore = [&buffer](unsigned end) {
        return end - static_cast<unsigned>(std::count(buffer.data(), buffer.data() + end, null));
    };
    const auto total = static_cast<unsigned>(buffer.size());
    if (bitsBefore(total) == 0) {
        throw std::invalid_argument("a circular buffer of " + std::to_string(bufferSize) +
                                    " has no bit of a block of " + std::to_string(K));
    }
    for (unsigned version = 0; version < redundancyVersions; ++version) {
        const unsigned k0 = itsRows * (2 * ((total + 8 * itsRows - 1) / (8 * itsRows)) * version + 2);
        itsStarts[version] = bitsBefore(k0 % total) % bitsBefore(total);
    }
    // Position 0 is a dummy bit in every block size.
    for (unsigned i = 1; i < total; ++i) {
        if (buffer[i] == null) {
            continue;
        }
        if (buffer[i - 1] == null) {
            itsRuns.push_back({static_cast<std::uint16_t>(itsPositions.size()), static_cast<std::uint16_t>(i), 0});
        }
        itsPositions.push_back(buffer[i]);
        ++itsRuns.back().count;
    }
}

void RateMatching::interleave(const std::array<const std::uint64_t*, 3>& streams, std::uint64_t* buffer) const
{
    const unsigned length = itsK + rules::tailPositions;
    std::fill_n(buffer, wordsOf(size()), 0);
    for (unsigned n = 0; n < size(); ++n) {
        const unsigned k = itsPositions[n] % length;
        buffer[n / 64] |= (streams[itsPositions[n] / length][k / 64] >> k % 64 & 1) << n % 64;
    }
}

void RateMatching::select(
    const std::uint64_t* buffer, unsigned version, std::size_t count, std::uint64_t* row, std::size_t to) const
{
    forRuns(size(), itsStarts[version], count, [=](unsigned first, std::size_t done, std::size_t now) {
        copyBits(buffer, first, now, row, to + done);
    });
}

void RateMatching::recover(const float* received, unsigned version, std::size_t count, float* buffer) const
{
    const RowKernels& kernels = rowKernels();
    forRuns(size(), itsStarts[version], count, [=, &kernels](unsigned first, std::size_t done, std::size_t now) {
        kernels.add(received + done, now, buffer + first);
    });
}

void RateMatching::recover(
    const std::int16_t* received, unsigned version, std::size_t count, unsigned width, std::int16_t* buffer) const
{
    const std::int32_t most = (1 << (width - 1)) - 1;
    const RowKernels& kernels = rowKernels();
    forRuns(size(), itsStarts[version], count, [=, &kernels](unsigned first, std::size_t done, std::size_t now) {
        kernels.addClipped(received + done, now, most, buffer + first);
    });
}

void RateMatching::place(const std::int8_t* received, unsigned version, std::size_t count, std::int8_t* buffer) const
{
    if (count < size()) {
        std::memset(buffer, 0, size());
    }
    forRuns(size(), itsStarts[version], count, [=](unsigned first, std::size_t done, std::size_t now) {
        std::memcpy(buffer + first, received + done, now);
    });
}

void RateMatching::deinterleave(const float* buffer, float filler, const std::array<float*, 3>& streams) const
{
    const unsigned length = itsK + rules::tailPositions;
    for (float* const stream : streams) {
        std::fill_n(stream, length, 0.0F);
    }
    std::fill_n(streams[0], itsFillers, filler);
    std::fill_n(streams[1], itsFillers, filler);
    for (unsigned n = 0; n < size(); ++n) {
        streams[itsPositions[n] / length][itsPositions[n] % length] = buffer[n];
    }
}

void RateMatching::deinterleave(const std::int8_t* buffer,
                                std::int8_t filler,
                                const std::array<std::int8_t*, 3>& streams) const
{
    const std::size_t matrix = std::size_t{columns} * itsRows;
    std::array<std::uint8_t, 3 * mostPositions> sent{};
    for (const Run& run : itsRuns) {
        std::memcpy(&sent[run.to], buffer + run.from, run.count);
    }
    std::array<std::uint8_t, mostPositions> systematic;
    std::array<std::uint8_t, mostPositions> parity1;
    std::array<std::uint8_t, mostPositions> parity2;
    const RowKernels& kernels = rowKernels();
    kernels.rowsOfOne(sent.data(), itsRows, systematic.data());
    kernels.rowsOfTwo(&sent[matrix], itsRows, parity1.data(), parity2.data());
    // There are 4 dummy bits or more, and the second parity is read one position later than the others.
    const std::size_t length = itsK + rules::tailPositions;
    const std::size_t dummies = matrix - length;
    std::memcpy(streams[0], &systematic[dummies], length);
    std::memcpy(streams[1], &parity1[dummies], length);
    std::memcpy(streams[2], &parity2[dummies - 1], length);
    std::fill_n(streams[0], itsFillers, filler);
    std::fill_n(streams[1], itsFillers, filler);
}

}  // namespace morvik::link

// CheckBlocks: the blocks that `morvik selftest` decodes, the same on every machine.
#include "CheckBlocks.h"

#include <cstdio>

#include "link/FrameSource.h"
#include "link/random/Random.h"
#include "rules/BlockSizes.h"
#include "rules/Tail.h"

namespace morvik::selftest {

namespace {

constexpr std::uint64_t seed = 36212;
constexpr double scale = 8;
/// Below what any size needs at few iterations: most blocks keep bit errors, whose ratios depend on everything.
constexpr int milliDecibels = 400;

/// Replaces the values of the block by uniformly distributed ones.
void randomise(CheckBatch& batch, std::uint32_t block)
{
    const link::RandomKey key = link::randomKey(seed);
    const std::size_t positions = batch.K + rules::tailPositions;
    for (std::size_t stream = 0; stream < 3; ++stream) {
        for (std::size_t i = 0; i < positions; ++i) {
            const link::RandomBlock random = link::randomBlock(key, i / 4, 3 * std::uint64_t{batch.K} + stream);
            batch.streams[stream][block * positions + i] =
                static_cast<std::int8_t>(static_cast<int>(random[i % 4] >> 24) - 128);
        }
    }
}

CheckBatch batchOf(unsigned K, std::uint32_t number)
{
    constexpr std::uint32_t lanes = 64;  // of the widest kernel, each with a block of one segment
    CheckBatch batch;
    batch.K = K;
    batch.blocks = 1 + lanes * 40 / K;
    batch.iterations = 1 + number % 3;
    link::Frames frames;
    link::FrameSource(K, milliDecibels, scale, seed).make(0, batch.blocks, frames);
    batch.streams = std::move(frames.streams);
    randomise(batch, batch.blocks - 1);
    return batch;
}

}  // namespace

std::string hexadecimal(std::uint64_t digest)
{
    char digits[17];
    std::snprintf(digits, sizeof digits, "%016llx", static_cast<unsigned long long>(digest));
    return digits;
}

std::vector<CheckBatch> checkBatches()
{
    std::vector<CheckBatch> batches;
    batches.reserve(rules::blockSizes.size());
    for (const rules::BlockSize& size : rules::blockSizes) {
        batches.push_back(batchOf(size.K, static_cast<std::uint32_t>(batches.size())));
    }
    return batches;
}

std::uint64_t digestOf(const std::vector<CheckBatch>& batches)
{
    Digest digest;
    for (const CheckBatch& batch : batches) {
        for (const auto& stream : batch.streams) {
            for (const std::int8_t value : stream) {
                digest.add(static_cast<std::uint8_t>(value));
            }
        }
    }
    return digest.value();
}

}  // namespace morvik::selftest

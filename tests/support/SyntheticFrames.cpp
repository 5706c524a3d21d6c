// SyntheticFrames: frames whose errors follow from their numbers, without a decoder.
#include "SyntheticFrames.h"

#include <gtest/gtest.h>

namespace morvik::support {

using namespace morvik::simulation;

std::uint32_t SyntheticFrames::wrongBits(std::uint64_t frame, std::size_t count) const
{
    const std::uint64_t mixed =
        (frame + 1) * 0x9e3779b97f4a7c15 ^ (std::uint64_t{itsSeed} + count) * 0xbf58476d1ce4e5b9;
    const auto hash = static_cast<std::uint32_t>(mixed * 0x94d049bb133111eb >> 32);
    return hash % 8 == 0 ? 1 + hash / 8 % 20 : 0;
}

std::uint32_t SyntheticFrames::clipped(std::uint64_t frame) const
{
    return static_cast<std::uint32_t>((frame * 7 + itsSeed) % 5);
}

BatchResult SyntheticFrames::result(const FrameBatch& batch, std::size_t counts) const
{
    BatchResult result;
    result.batch = batch;
    for (std::uint64_t frame = batch.first; frame < batch.first + batch.count; ++frame) {
        for (std::size_t i = 0; i < counts; ++i) {
            result.wrongBits.push_back(wrongBits(frame, i));
        }
        result.clipped.push_back(clipped(frame));
    }
    return result;
}

Tally countOneByOne(const SyntheticFrames& frames, FrameRange range, const StopRules& rules, std::size_t counts)
{
    Tally tally(counts);
    for (std::uint64_t frame = range.from; frame < range.to; ++frame) {
        for (std::size_t i = 0; i < counts; ++i) {
            tally.errors[i].add(frame, frames.wrongBits(frame, i));
        }
        tally.clipped += frames.clipped(frame);
        tally.blocks += 1;
        const ErrorCounts& last = tally.errors.back();
        if ((rules.maxBlocks && tally.blocks == *rules.maxBlocks) ||
            (rules.blockErrors && last.blockErrors == *rules.blockErrors) ||
            (rules.bitErrors && last.bitErrors >= *rules.bitErrors)) {
            break;
        }
    }
    return tally;
}

void expectEqual(const Tally& got, const Tally& expected)
{
    EXPECT_EQ(got.blocks, expected.blocks);
    EXPECT_EQ(got.clipped, expected.clipped);
    ASSERT_EQ(got.errors.size(), expected.errors.size());
    for (std::size_t i = 0; i < got.errors.size(); ++i) {
        EXPECT_EQ(got.errors[i].bitErrors, expected.errors[i].bitErrors);
        EXPECT_EQ(got.errors[i].blockErrors, expected.errors[i].blockErrors);
        EXPECT_EQ(got.errors[i].bitErrorSquares, expected.errors[i].bitErrorSquares);
        EXPECT_EQ(got.errors[i].failures, expected.errors[i].failures);
    }
}

}  // namespace morvik::support

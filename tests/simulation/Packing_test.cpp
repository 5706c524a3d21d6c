// Packing: what is unpacked is what was packed.
#include "simulation/Packing.h"

#include <gtest/gtest.h>

#include <cstdint>
#include <stdexcept>

#include "support/SyntheticFrames.h"

namespace morvik::simulation {
namespace {

void expectEqual(const FrameBatch& got, const FrameBatch& expected)
{
    EXPECT_EQ(got.point, expected.point);
    EXPECT_EQ(got.first, expected.first);
    EXPECT_EQ(got.count, expected.count);
}

void expectKept(const BatchResult& result)
{
    const BatchResult got = unpackedResult(packed(result));
    expectEqual(got.batch, result.batch);
    EXPECT_EQ(got.wrongBits, result.wrongBits);
    EXPECT_EQ(got.clipped, result.clipped);
}

TEST(Packing, KeepsBatches)
{
    for (const FrameBatch& batch : {FrameBatch{0, 0, 0},
                                    FrameBatch{127, 128, 129},
                                    FrameBatch{16384, 16383, 255},
                                    FrameBatch{SIZE_MAX, UINT64_MAX, UINT32_MAX}}) {
        expectEqual(unpackedBatch(packed(batch)), batch);
    }
}

TEST(Packing, KeepsResults)
{
    for (const std::size_t counts : {1U, 2U, 15U}) {
        for (const std::uint32_t count : {1U, 2U, 64U, 1000U}) {
            expectKept(morvik::support::SyntheticFrames(7).result({3, std::uint64_t{1} << 40, count}, counts));
        }
    }
}

TEST(Packing, KeepsWhatIsRare)
{
    BatchResult result;
    result.batch = {1, 2, 5};
    result.clipped = {0, 0, UINT32_MAX, 0, 0};
    result.wrongBits = {0, 0, 0, 0, 0, 0, 0, 0, 6144, 0};
    expectKept(result);
    result.clipped = {0, 0, 0, 0, 1};
    expectKept(result);
    result.clipped.back() = 0;
    expectKept(result);
}

TEST(Packing, TakesNoRoomForFramesThatWentWell)
{
    BatchResult result;
    result.batch = {0, 0, 10000};
    result.clipped.resize(10000);
    result.wrongBits.resize(10000);
    EXPECT_LT(packed(result).size(), 10U);
    result.wrongBits[5000] = 3;
    EXPECT_LT(packed(result).size(), 14U);
}

TEST(Packing, RefusesWhatIsDamaged)
{
    const std::string batch = packed(FrameBatch{1, 300, 2});
    EXPECT_THROW(unpackedBatch(batch.substr(0, batch.size() - 1)), std::runtime_error);
    EXPECT_THROW(unpackedBatch(batch + '\0'), std::runtime_error);
    EXPECT_THROW(unpackedBatch(std::string(20, '\xff')), std::runtime_error);
    EXPECT_THROW(unpackedBatch(packed(FrameBatch{1, 2, 0}).substr(0, 2) + "\xff\xff\xff\xff\x1f"), std::runtime_error);

    BatchResult result;
    result.batch = {0, 0, 2};
    result.clipped = {1, 2};
    result.wrongBits = {3, 4};
    const std::string whole = packed(result);
    EXPECT_THROW(unpackedResult(whole.substr(0, whole.size() - 1)), std::runtime_error);
    EXPECT_THROW(unpackedResult(whole + std::string(3, '\0')), std::runtime_error) << "there is no third frame";
}

}  // namespace
}  // namespace morvik::simulation

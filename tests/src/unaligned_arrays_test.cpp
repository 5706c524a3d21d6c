// Unaligned arrays: the caller's arrays may begin at any address, as those of packed records and of files do. The
// sanitizers tell where the library takes more for granted.
#include <gtest/gtest.h>

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <vector>

#include "support/Batches.h"
#include "support/Blocks.h"
#include "support/CapturedStreams.h"

namespace {

/// An array one byte beyond an address that would suit it.
template <class Value>
class Misplaced {
public:
    explicit Misplaced(std::size_t size, Value value = {}) : Misplaced(std::vector<Value>(size, value)) {}

    explicit Misplaced(const std::vector<Value>& values)
        : itsSize(values.size()), itsBytes(values.size() * sizeof(Value) + 1 + alignof(std::max_align_t))
    {
        while (reinterpret_cast<std::uintptr_t>(itsBytes.data() + itsOffset) % alignof(std::max_align_t) != 1) {
            ++itsOffset;
        }
        std::memcpy(itsBytes.data() + itsOffset, values.data(), values.size() * sizeof(Value));
    }

    Value* data()
    {
        return reinterpret_cast<Value*>(itsBytes.data() + itsOffset);
    }

    std::vector<Value> values() const
    {
        std::vector<Value> copy(itsSize);
        std::memcpy(copy.data(), itsBytes.data() + itsOffset, itsSize * sizeof(Value));
        return copy;
    }

private:
    std::size_t itsSize;
    std::size_t itsOffset = 0;
    std::vector<unsigned char> itsBytes;
};

constexpr unsigned count = 3;
constexpr unsigned K = 128;

/// Noisy blocks with a value that has to be clipped where `beyond`, and what a batch of them gives.
template <class Input>
struct Batch {
    morvik::blocks::Batch<Input> aligned;
    std::vector<std::uint32_t> tags = {1, 2, 0x303};
    Misplaced<Input> sys;
    Misplaced<Input> par1;
    Misplaced<Input> par2;
    Misplaced<std::uint32_t> misplacedTags{tags};

    explicit Batch(bool beyond) : aligned(noisy(beyond)), sys(aligned.sys), par1(aligned.par1), par2(aligned.par2) {}

    static std::vector<morvik::blocks::Block> noisy(bool beyond)
    {
        morvik::blocks::Random random(1);
        std::vector<morvik::blocks::Block> some;
        for (unsigned b = 0; b < count; ++b) {
            some.push_back(morvik::blocks::encode(morvik::blocks::randomBits(random, K), 12));
            morvik::blocks::addNoise(random, 14.0, some.back());
        }
        some[1].par1[7] = beyond ? 300 : 3;
        some[1].par1[K + 2] = beyond ? -300 : 3;
        return some;
    }
};

template <class Input>
void expectTheSame(const std::string& set, bool beyond)
{
    SCOPED_TRACE(set + ", " + std::to_string(8 * sizeof(Input)) + " bits, beyond: " + std::to_string(beyond ? 1 : 0));
    const CapturedStreams streams;
    morvik::blocks::Decoder decoder(2, 1);
    ASSERT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), set.c_str()), 0);
    Batch<Input> batch(beyond);
    morvik::blocks::Decoder components(2, 1);
    components.decodeByComponents();
    const morvik::blocks::Decoded expected =
        morvik::blocks::decodedOneByOne(components.state(), batch.aligned, 3, batch.tags.data());
    Misplaced<std::uint8_t> bits(std::size_t{count} * K);
    Misplaced<std::int16_t> ratios(std::size_t{count} * K);
    Misplaced<std::uint32_t> tags(count);
    morvik::blocks::BatchOutputs outputs{bits.data(), count * K, ratios.data(), count * K, tags.data(), count, 0};
    const Input* const inputs[] = {batch.sys.data(), batch.par1.data(), batch.par2.data()};
    ASSERT_EQ(
        morvik::blocks::simulateBatch(decoder.state(), inputs, K + 4, count, 3, batch.misplacedTags.data(), &outputs),
        0);
    EXPECT_EQ(bits.values(), expected.bits);
    EXPECT_EQ(ratios.values(), expected.ratios);
    EXPECT_EQ(tags.values(), expected.tags);
}

}  // namespace

TEST(UnalignedArrays, OfABatchGiveWhatAlignedOnesGive)
{
    for (const std::string& set : morvik::blocks::instructionSets()) {
        for (const bool beyond : {false, true}) {
            expectTheSame<std::int32_t>(set, beyond);
            expectTheSame<std::int16_t>(set, beyond);
        }
        expectTheSame<std::int8_t>(set, false);
    }
}

TEST(UnalignedArrays, OfASingleCallGiveWhatAlignedOnesGive)
{
    const CapturedStreams streams;
    for (const std::string& set : morvik::blocks::instructionSets()) {
        for (const bool beyond : {false, true}) {
            SCOPED_TRACE(set);
            morvik::blocks::Decoder decoder(2, 1);
            ASSERT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), set.c_str()), 0);
            Batch<std::int32_t> batch(beyond);
            for (unsigned b = 0; b < count; ++b) {
                const std::size_t first = std::size_t{b} * (K + 4);
                Misplaced<std::uint8_t> bits(K);
                veltra_ip_morvik_v1_0_outputs outputs{bits.data(), K, 0, 0};
                ASSERT_EQ(veltra_ip_morvik_v1_0_bitacc_simulate(decoder.state(),
                                                                batch.sys.data() + first,
                                                                batch.par1.data() + first,
                                                                batch.par2.data() + first,
                                                                K + 4,
                                                                3,
                                                                0,
                                                                &outputs),
                          0);
                EXPECT_EQ(bits.values(), decoder.decode(batch.aligned.block(b), 3).bits);
            }
        }
    }
}

TEST(UnalignedArrays, OfACountGiveWhatAlignedOnesGive)
{
    for (const std::string& set : morvik::blocks::instructionSets()) {
        SCOPED_TRACE(set);
        morvik::blocks::Decoder decoder(2, 1);
        ASSERT_EQ(veltra_ip_morvik_v1_0_set_instruction_set(decoder.state(), set.c_str()), 0);
        Batch<std::int16_t> batch(false);
        Misplaced<std::uint8_t> sent(std::size_t{count} * K, 1);
        std::vector<std::uint32_t> expected(2 * count);
        Misplaced<std::uint32_t> errors(2 * count);
        ASSERT_EQ(batch.aligned.countErrors(decoder.state(), 2, sent.data(), expected.data(), 2 * count), 0);
        ASSERT_EQ(veltra_ip_morvik_v1_0_batch_count_errors_i16(decoder.state(),
                                                               batch.sys.data(),
                                                               batch.par1.data(),
                                                               batch.par2.data(),
                                                               K + 4,
                                                               count,
                                                               2,
                                                               sent.data(),
                                                               errors.data(),
                                                               2 * count),
                  0);
        EXPECT_EQ(errors.values(), expected);
    }
}

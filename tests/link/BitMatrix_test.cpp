// BitMatrix: tests of the transposition.
#include "link/coding/BitMatrix.h"

#include <gtest/gtest.h>

#include <random>

TEST(BitMatrix, ExchangesRowsAndColumns)
{
    std::mt19937_64 random(1);
    for (unsigned round = 0; round < 20; ++round) {
        morvik::link::BitMatrix matrix;
        for (std::uint64_t& row : matrix) {
            row = random();
        }
        const morvik::link::BitMatrix before = matrix;
        morvik::link::transpose(matrix);
        for (unsigned r = 0; r < 64; ++r) {
            for (unsigned c = 0; c < 64; ++c) {
                ASSERT_EQ(matrix[r] >> c & 1, before[c] >> r & 1) << r << ' ' << c;
            }
        }
    }
}

TEST(BitMatrix, MovesSingleBits)
{
    for (unsigned r = 0; r < 64; ++r) {
        for (unsigned c = 0; c < 64; ++c) {
            morvik::link::BitMatrix matrix{};
            matrix[r] = std::uint64_t{1} << c;
            morvik::link::transpose(matrix);
            morvik::link::BitMatrix expected{};
            expected[c] = std::uint64_t{1} << r;
            ASSERT_EQ(matrix, expected) << r << ' ' << c;
        }
    }
}

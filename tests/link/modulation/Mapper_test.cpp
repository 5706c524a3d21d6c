// Mapper: tests against the tables of TS 36.211.
#include "link/modulation/Mapper.h"

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <map>
#include <set>
#include <string>
#include <vector>

namespace {

using morvik::link::Modulation;

/// The symbol of a text of 0 and 1.
std::complex<double> symbolOf(Modulation modulation, const std::string& bits)
{
    std::uint64_t row = 0;
    for (std::size_t i = 0; i < bits.size(); ++i) {
        row |= std::uint64_t{bits[i] == '1'} << i;
    }
    std::array<float, 2> symbol{};
    morvik::link::mapSymbols(modulation, &row, 1, symbol.data());
    return {symbol[0], symbol[1]};
}

void expectLevels(Modulation modulation, const std::map<std::string, std::pair<int, int>>& table, double norm)
{
    for (const auto& [bits, levels] : table) {
        const std::complex<double> symbol = symbolOf(modulation, bits);
        EXPECT_NEAR(symbol.real(), levels.first / std::sqrt(norm), 1e-6) << bits;
        EXPECT_NEAR(symbol.imag(), levels.second / std::sqrt(norm), 1e-6) << bits;
    }
}

}  // namespace

TEST(MapperTest, SendsTheTablesOfTheStandard)
{
    EXPECT_EQ(symbolOf(Modulation::bpsk, "0").real(), -1);
    EXPECT_EQ(symbolOf(Modulation::bpsk, "1").real(), 1);
    // Table 7.1.2-1
    expectLevels(Modulation::qpsk, {{"00", {1, 1}}, {"01", {1, -1}}, {"10", {-1, 1}}, {"11", {-1, -1}}}, 2);
    // Table 7.1.3-1
    expectLevels(Modulation::qam16,
                 {{"0000", {1, 1}},
                  {"0001", {1, 3}},
                  {"0010", {3, 1}},
                  {"0011", {3, 3}},
                  {"0100", {1, -1}},
                  {"0101", {1, -3}},
                  {"0110", {3, -1}},
                  {"0111", {3, -3}},
                  {"1000", {-1, 1}},
                  {"1001", {-1, 3}},
                  {"1010", {-3, 1}},
                  {"1011", {-3, 3}},
                  {"1100", {-1, -1}},
                  {"1101", {-1, -3}},
                  {"1110", {-3, -1}},
                  {"1111", {-3, -3}}},
                 10);
    // Rows of table 7.1.4-1
    expectLevels(Modulation::qam64,
                 {{"000000", {3, 3}},
                  {"000001", {3, 1}},
                  {"000010", {1, 3}},
                  {"000101", {3, 7}},
                  {"001100", {5, 5}},
                  {"001111", {7, 7}},
                  {"010110", {1, -5}},
                  {"100011", {-1, 1}},
                  {"101010", {-7, 3}},
                  {"111111", {-7, -7}}},
                 42);
}

TEST(MapperTest, Sends256QamByTheFormulaOfClause715)
{
    for (unsigned symbol = 0; symbol < 256; ++symbol) {
        std::string bits;
        std::array<int, 8> signs{};
        for (unsigned i = 0; i < 8; ++i) {
            const bool bit = (symbol >> i & 1) != 0;
            bits += bit ? '1' : '0';
            signs[i] = bit ? -1 : 1;
        }
        const int real = signs[0] * (8 - signs[2] * (4 - signs[4] * (2 - signs[6])));
        const int imaginary = signs[1] * (8 - signs[3] * (4 - signs[5] * (2 - signs[7])));
        expectLevels(Modulation::qam256, {{bits, {real, imaginary}}}, 170);
    }
}

TEST(MapperTest, SymbolsHaveMeanEnergyOne)
{
    for (const Modulation modulation : morvik::link::modulations) {
        const unsigned bits = morvik::link::bitsPerSymbol(modulation);
        double energy = 0;
        for (std::uint64_t row = 0; row < 1U << bits; ++row) {
            std::array<float, 2> symbol{};
            morvik::link::mapSymbols(modulation, &row, 1, symbol.data());
            energy += std::norm(std::complex<double>(symbol[0], symbol[1]));
        }
        EXPECT_NEAR(energy / (1U << bits), 1, 1e-6) << nameOf(modulation);
    }
}

TEST(MapperTest, TakesTheBitsOfARowInTheirOrder)
{
    // Of eight words: symbols of six bits cross from one to the next.
    std::array<std::uint64_t, 8> row{};
    std::uint64_t word = 0xFEDCBA9876543210;
    for (std::uint64_t& bits : row) {
        bits = word;
        word = word * 6364136223846793005U + 1442695040888963407U;
    }
    for (const Modulation modulation : morvik::link::modulations) {
        const unsigned perSymbol = morvik::link::bitsPerSymbol(modulation);
        const unsigned numbers = morvik::link::dimensions(modulation);
        const unsigned symbols = 508 / perSymbol;
        std::vector<float> together(std::size_t{symbols} * numbers);
        morvik::link::mapSymbols(modulation, row.data(), symbols, together.data());
        for (unsigned n = 0; n < symbols; ++n) {
            std::string bits;
            for (unsigned i = perSymbol * n; i < perSymbol * (n + 1); ++i) {
                bits += (row[i / 64] >> i % 64 & 1) != 0 ? '1' : '0';
            }
            const double imaginary = numbers == 2 ? together[std::size_t{2} * n + 1] : 0.0;
            EXPECT_EQ(symbolOf(modulation, bits), std::complex<double>(together[std::size_t{numbers} * n], imaginary))
                << nameOf(modulation) << ' ' << n;
        }
    }
}

TEST(MapperTest, IgnoresTheBitsBehindItsSymbols)
{
    const std::uint64_t row = ~std::uint64_t{0};
    for (const Modulation modulation : morvik::link::modulations) {
        const std::string ones(morvik::link::bitsPerSymbol(modulation), '1');
        const unsigned numbers = morvik::link::dimensions(modulation);
        std::array<float, 14> symbols{};
        morvik::link::mapSymbols(modulation, &row, 7, symbols.data());
        for (unsigned n = 0; n < 7; ++n) {
            EXPECT_EQ(symbols[std::size_t{numbers} * n], symbolOf(modulation, ones).real())
                << nameOf(modulation) << ' ' << n;
        }
    }
}

TEST(ModulationTest, HasNames)
{
    std::set<Modulation> different;
    for (const Modulation modulation : morvik::link::modulations) {
        EXPECT_TRUE(different.insert(modulation).second);
        EXPECT_EQ(morvik::link::modulationOf(nameOf(modulation)), modulation);
    }
    EXPECT_EQ(nameOf(Modulation::qam64), "64qam");
    EXPECT_EQ(morvik::link::modulationOf("64QAM"), std::nullopt);
}

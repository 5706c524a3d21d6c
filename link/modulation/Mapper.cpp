// Mapper: from coded bits to symbols.
#include "Mapper.h"

#include <algorithm>
#include <array>
#include <cstring>
#include <vector>

namespace morvik::link {

namespace {

/// The odd number that m bits of a dimension stand for: (1 - 2 b0) (8 - (1 - 2 b2) (4 - ...)), b0 in bit 0.
int level(unsigned bits, unsigned m)
{
    const auto sign = [=](unsigned i) {
        return (bits >> i & 1) != 0 ? -1 : 1;
    };
    int magnitude = 1;
    for (unsigned i = 1; i < m; ++i) {
        magnitude = (1 << i) - sign(m - i) * magnitude;
    }
    return sign(0) * magnitude;
}

/// The numbers of several symbols by their bits: 8 bits, or 6 of 64QAM.
class SymbolTable {
public:
    explicit SymbolTable(Modulation modulation)
        : bits(modulation == Modulation::qam64 ? 6 : 8),
          symbols(bits / bitsPerSymbol(modulation)),
          numbers(symbols * dimensions(modulation))
    {
        const unsigned m = bitsPerDimension(modulation);
        const unsigned across = dimensions(modulation);
        const float unit = modulation == Modulation::bpsk ? -unitAmplitude(modulation) : unitAmplitude(modulation);
        for (unsigned entry = 0; entry < 1U << bits; ++entry) {
            for (unsigned n = 0; n < numbers; ++n) {
                unsigned own = 0;
                for (unsigned i = 0; i < m; ++i) {
                    own |= (entry >> (n / across * m * across + n % across + i * across) & 1) << i;
                }
                itsNumbers.push_back(static_cast<float>(level(own, m)) * unit);
            }
        }
    }

    const float* operator[](std::size_t entry) const
    {
        return &itsNumbers[entry * numbers];
    }

    const unsigned bits;     ///< of an entry
    const unsigned symbols;  ///< of an entry
    const unsigned numbers;  ///< of an entry

private:
    std::vector<float> itsNumbers;
};

const SymbolTable& tableOf(Modulation modulation)
{
    static const std::array<SymbolTable, modulations.size()> tables = {SymbolTable(Modulation::bpsk),
                                                                       SymbolTable(Modulation::qpsk),
                                                                       SymbolTable(Modulation::qam16),
                                                                       SymbolTable(Modulation::qam64),
                                                                       SymbolTable(Modulation::qam256)};
    return tables[static_cast<unsigned>(modulation)];
}

/// Copies whole entries, whose size the compiler knows.
template <unsigned bits, unsigned numbers>
void copyEntries(const SymbolTable& table, const std::uint64_t* row, std::size_t entries, float* to)
{
    constexpr std::uint64_t mask = (1U << bits) - 1;
    const float* const start = table[0];
    for (std::size_t e = 0; e < entries; ++e) {
        const std::size_t first = e * bits;
        std::uint64_t own = row[first / 64] >> first % 64;
        if (64 % bits != 0 && first % 64 > 64 - bits) {
            own |= row[first / 64 + 1] << (64 - first % 64);
        }
        std::memcpy(to + e * numbers, start + static_cast<std::size_t>(own & mask) * numbers, numbers * sizeof(float));
    }
}

}  // namespace

void mapSymbols(Modulation modulation, const std::uint64_t* bits, std::size_t count, float* symbols)
{
    const SymbolTable& table = tableOf(modulation);
    const std::size_t entries = count / table.symbols;
    switch (modulation) {
    case Modulation::bpsk:
    case Modulation::qpsk:
        copyEntries<8, 8>(table, bits, entries, symbols);
        break;
    case Modulation::qam16:
        copyEntries<8, 4>(table, bits, entries, symbols);
        break;
    case Modulation::qam64:
        copyEntries<6, 2>(table, bits, entries, symbols);
        break;
    case Modulation::qam256:
        copyEntries<8, 2>(table, bits, entries, symbols);
    }
    // What is left is less than an entry, whose bits stand in one word.
    const std::size_t left = count % table.symbols;
    if (left > 0) {
        const std::size_t first = entries * table.bits;
        const auto entry = static_cast<std::size_t>(bits[first / 64] >> first % 64 & ((1U << table.bits) - 1));
        std::copy_n(table[entry], left * dimensions(modulation), symbols + entries * table.numbers);
    }
}

}  // namespace morvik::link

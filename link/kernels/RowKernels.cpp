// RowKernels: loops over rows of numbers, compiled once for each instruction set.
//
// Compilers turn the loops into vectors. Everything but the table of functions has internal linkage, so that no code of
// one set is taken for that of another.
#include "RowKernels.h"

namespace morvik::link {

namespace {

// ---- Sums and soft values

void add(const float* numbers, std::size_t count, float* sums)
{
    for (std::size_t i = 0; i < count; ++i) {
        sums[i] += numbers[i];
    }
}

void addClipped(const std::int16_t* numbers, std::size_t count, std::int32_t most, std::int16_t* sums)
{
    for (std::size_t i = 0; i < count; ++i) {
        const std::int32_t sum = sums[i] + numbers[i];
        const std::int32_t above = sum > -most - 1 ? sum : -most - 1;
        sums[i] = static_cast<std::int16_t>(above < most ? above : most);
    }
}

void addNoise(const std::int16_t* numbers, std::size_t count, float unit, float* sums)
{
    for (std::size_t i = 0; i < count; ++i) {
        sums[i] += static_cast<float>(numbers[i]) * unit;
    }
}

template <typename Integer>
std::uint32_t roundTo(const float* numbers, std::size_t count, float scale, float end, Integer* rounded)
{
    // The largest float below a half: added to a float below 2^23, it reaches the next integer from a half on.
    constexpr float almostHalf = 0.49999997F;
    std::uint32_t clipped = 0;
    for (std::size_t i = 0; i < count; ++i) {
        const float value = numbers[i] * scale;
        clipped += value > -end - 0.5F && value < end - 0.5F ? 0U : 1U;
        const float above = value > -end ? value : -end;
        const float kept = above < end - 1 ? above : end - 1;
        rounded[i] = static_cast<Integer>(static_cast<std::int32_t>(kept + __builtin_copysignf(almostHalf, kept)));
    }
    return clipped;
}

// ---- Symbols

/// Numbers of `bits` bits each that are mapped at once: their bits fit in 32.
template <unsigned bits>
struct Group {
    static constexpr unsigned count = bits <= 2 ? 16 : 8;
    static constexpr unsigned size = count * bits;

    typedef std::uint32_t Words __attribute__((vector_size(4 * count)));
    typedef std::int32_t Integers __attribute__((vector_size(4 * count)));
    typedef float Numbers __attribute__((vector_size(4 * count)));
};

/// Shifts that bring the bits of each number, every other one of a symbol's, to bit 0.
template <unsigned bits>
void takePlaces(typename Group<bits>::Words& places)
{
    for (unsigned n = 0; n < Group<bits>::count; ++n) {
        places[n] = n / 2 * 2 * bits + n % 2;
    }
}

/// Magnitudes of numbers whose bits stand in every other place, the first one, their sign, lowest.
template <unsigned bits>
void takeMagnitudes(const typename Group<bits>::Words& numbers, typename Group<bits>::Numbers& taken)
{
    using Words = typename Group<bits>::Words;
    const Words one = Words{} + 1;
    // A bit less 1 is all ones or all zeros: of a 0, the sign changes.
    Words magnitudes = one;
    for (unsigned i = 1; i < bits; ++i) {
        const Words turned = (numbers >> 2 * (bits - i) & one) - one;
        magnitudes = (one << i) + (magnitudes ^ turned) - turned;
    }
    taken = __builtin_convertvector(reinterpret_cast<typename Group<bits>::Integers>(magnitudes),
                                    typename Group<bits>::Numbers);
}

/// Maps a group from bit `first` of a row on. Reads no word without a bit of its first `count` numbers.
template <unsigned bits>
void mapGroup(const std::uint64_t* row,
              std::size_t first,
              std::size_t count,
              float unit,
              const typename Group<bits>::Words& places,
              typename Group<bits>::Numbers& mapped)
{
    using Words = typename Group<bits>::Words;
    std::uint64_t word = row[first / 64] >> first % 64;
    if (64 % Group<bits>::size != 0 && first % 64 + count * bits > 64) {
        word |= row[first / 64 + 1] << (64 - first % 64);
    }
    const Words shifted = (Words{} + static_cast<std::uint32_t>(word & 0xFFFFFFFF)) >> places;
    takeMagnitudes<bits>(shifted, mapped);
    mapped = reinterpret_cast<typename Group<bits>::Numbers>(reinterpret_cast<Words>(mapped * unit) ^ shifted << 31);
}

template <unsigned bits>
void mapTo(const std::uint64_t* row, std::size_t count, float unit, float* numbers)
{
    constexpr unsigned most = Group<bits>::count;
    typename Group<bits>::Words places;
    takePlaces<bits>(places);
    typename Group<bits>::Numbers mapped;
    std::size_t n = 0;
    for (; n + most <= count; n += most) {
        mapGroup<bits>(row, n * bits, most, unit, places, mapped);
        __builtin_memcpy(numbers + n, &mapped, sizeof mapped);
    }
    if (n < count) {
        mapGroup<bits>(row, n * bits, count - n, unit, places, mapped);
        __builtin_memcpy(numbers + n, &mapped, (count - n) * sizeof(float));
    }
}

void map(const std::uint64_t* row, unsigned bits, std::size_t count, float unit, float* numbers)
{
    switch (bits) {
    case 1:
        return mapTo<1>(row, count, unit, numbers);
    case 2:
        return mapTo<2>(row, count, unit, numbers);
    case 3:
        return mapTo<3>(row, count, unit, numbers);
    default:
        return mapTo<4>(row, count, unit, numbers);
    }
}

void amplitudes(const std::int16_t* numbers, std::size_t count, float unit, float* roots)
{
    for (std::size_t i = 0; i < count; ++i) {
        const std::int32_t first = numbers[2 * i];
        const std::int32_t second = numbers[2 * i + 1];
        roots[i] = __builtin_sqrtf(static_cast<float>(first * first + second * second) * unit);
    }
}

void fade(const float* gains, std::size_t symbols, unsigned across, float* numbers)
{
    if (across == 1) {
        for (std::size_t i = 0; i < symbols; ++i) {
            numbers[i] *= gains[i];
        }
        return;
    }
    for (std::size_t i = 0; i < symbols; ++i) {
        numbers[2 * i] *= gains[i];
        numbers[2 * i + 1] *= gains[i];
    }
}

// ---- Columns and rows

// Column j is at place P(j) of a row, P being the reversal of five bits. So columns j and j + 16 are neighbours in a
// row: put side by side, they are 16 columns of pairs, of which j and j + 8 are neighbours, and so on.

/// The largest code block has 193 rows.
constexpr std::size_t mostRows = 193;

/// One step: units of `bytes` bytes, from the first and the second half in turn.
template <std::size_t bytes>
void pairColumns(const std::uint8_t* from, std::size_t size, std::uint8_t* to)
{
    const std::uint8_t* const second = from + size / 2;
    for (std::size_t i = 0; i < size / 2; i += bytes) {
        __builtin_memcpy(to + 2 * i, from + i, bytes);
        __builtin_memcpy(to + 2 * i + bytes, second + i, bytes);
    }
}

/// All steps for values of `bytes` bytes, from `a` to `b` by way of both.
template <std::size_t bytes>
void rowsOf(std::uint8_t* a, std::size_t size, std::uint8_t* b)
{
    pairColumns<bytes>(a, size, b);
    pairColumns<2 * bytes>(b, size, a);
    pairColumns<4 * bytes>(a, size, b);
    pairColumns<8 * bytes>(b, size, a);
    pairColumns<16 * bytes>(a, size, b);
}

void rowsOfOne(std::uint8_t* columns, std::size_t rows, std::uint8_t* values)
{
    rowsOf<1>(columns, 32 * rows, values);
}

void rowsOfTwo(std::uint8_t* columns, std::size_t rows, std::uint8_t* first, std::uint8_t* second)
{
    std::uint8_t pairs[64 * mostRows] = {};
    rowsOf<2>(columns, 64 * rows, pairs);
    for (std::size_t i = 0; i < 32 * rows; ++i) {
        first[i] = pairs[2 * i];
        second[i] = pairs[2 * i + 1];
    }
}

// ---- Ratios

/// Dimensions that are computed at once: a vector of any set divides it.
constexpr std::size_t chunk = 128;

/// A number of each dimension.
using Numbers = float[chunk];

/// A received number and the energy of the unit amplitude, both times factors that make them a dimension's ratio.
struct Chunk {
    Numbers x;
    Numbers energy;
    float ratios[4][chunk];  ///< of each bit
};

void load(const DimensionRow& row, std::size_t first, std::size_t count, float slope, float energy, Chunk& to)
{
    const float* const received = row.received + first;
    if (row.gains == nullptr) {
        for (std::size_t n = 0; n < count; ++n) {
            to.x[n] = received[n] * slope;
            to.energy[n] = energy;
        }
        return;
    }
    const float* const gains = row.gains + first / 2;
    for (std::size_t s = 0; s < count / 2; ++s) {
        to.energy[2 * s] = gains[s];
        to.energy[2 * s + 1] = gains[s];
    }
    for (std::size_t n = 0; n < count; ++n) {
        const float gain = to.energy[n];
        to.x[n] = received[n] * (slope * gain);
        to.energy[n] = energy * (gain * gain);
    }
}

/// Puts the ratios of each symbol in the order of its bits.
template <unsigned bits>
void store(const Chunk& from, std::size_t count, float* ratios)
{
    for (std::size_t s = 0; s < count / 2; ++s) {
        for (std::size_t i = 0; i < bits; ++i) {
            __builtin_memcpy(ratios + 2 * (bits * s + i), &from.ratios[i][2 * s], 2 * sizeof(float));
        }
    }
}

/// Of the first bit of 2^bits levels: the nearest level of the sign of x against the nearest one of the other sign. The
/// distance of neighbours is `step`.
template <unsigned bits>
float signRatio(float x, float step)
{
    float ratio = x;
    for (unsigned k = 1; k < 1U << (bits - 1); ++k) {
        const float beyond = x - static_cast<float>(k) * step;
        ratio += beyond > 0 ? beyond : 0;
    }
    return ratio;
}

/// The ratio of the sign of x; then x is folded at the middle of the positive levels, and the rest of the bits are
/// those of half as many levels.
template <unsigned bits>
void maxLogChunk(Chunk& values, unsigned bit)
{
    for (std::size_t n = 0; n < chunk; ++n) {
        const float x = values.x[n];
        const float magnitude = x > 0 ? x : -x;
        const float ratio = signRatio<bits>(magnitude, values.energy[n]);
        values.ratios[bit][n] = x > 0 ? -ratio : ratio;
        values.x[n] = static_cast<float>(1U << (bits - 1)) / 2 * values.energy[n] - magnitude;
    }
    if constexpr (bits > 1) {
        maxLogChunk<bits - 1>(values, bit + 1);
    }
}

/// ln(1 + exp(-x)) for x of at least 0, off by at most 2e-7.
float logOnePlusExp(float value)
{
    constexpr float log2e = 1.44269504F;
    constexpr float ln2High = 0.693145752F;  // few bits, so that its multiples are exact
    constexpr float ln2Low = 1.42860677e-6F;
    constexpr float magic = 12582912;  // 1.5 * 2^23: a float that is added to it loses its fraction
    const float x = value < 80 ? value : 80;
    const float halvings = (x * log2e + magic) - magic;
    const float rest = (halvings * ln2High - x) + halvings * ln2Low;  // from -ln 2 / 2 to ln 2 / 2
    const float power =
        (((((rest * (1.0F / 720) + 1.0F / 120) * rest + 1.0F / 24) * rest + 1.0F / 6) * rest + 0.5F) * rest + 1) *
            rest +
        1;
    const std::int32_t bits = (127 - static_cast<std::int32_t>(halvings)) << 23;  // 2^-halvings
    float scale;
    __builtin_memcpy(&scale, &bits, sizeof scale);
    const float exponential = power * scale;
    // ln(1 + e) = 2 artanh(e / (2 + e)), as a series.
    const float ratio = exponential / (2 + exponential);
    const float square = ratio * ratio;
    const float series =
        (((((square * (1.0F / 13) + 1.0F / 11) * square + 1.0F / 9) * square + 1.0F / 7) * square + 1.0F / 5) * square +
         1.0F / 3) *
            square +
        1;
    return 2 * ratio * series;
}

void logsOnePlusExp(const float* x, std::size_t count, float* logarithms)
{
    for (std::size_t i = 0; i < count; ++i) {
        logarithms[i] = logOnePlusExp(x[i]);
    }
}

/// ln(exp(a) + exp(b)).
float logOfSum(float a, float b)
{
    const float larger = a > b ? a : b;
    const float smaller = a > b ? b : a;
    return larger + logOnePlusExp(larger - smaller);
}

/// ln(exp(a) + exp(b)) of each dimension.
void addLogarithms(const Numbers& numbers, Numbers& sums)
{
    for (std::size_t n = 0; n < chunk; ++n) {
        sums[n] = logOfSum(sums[n], numbers[n]);
    }
}

/// Metrics of 2^bits levels, the lowest first: the ratio of their signs; then levels of one magnitude are added up, and
/// the rest of the bits are those of the magnitudes, from the largest, which is negative when folded, to the smallest.
template <unsigned bits>
void exactBits(Numbers* metrics, unsigned bit, Chunk& values)
{
    constexpr unsigned half = 1U << (bits - 1);
    Numbers positive;
    for (std::size_t n = 0; n < chunk; ++n) {
        values.ratios[bit][n] = metrics[0][n];
        positive[n] = metrics[half][n];
    }
    for (unsigned i = 1; i < half; ++i) {
        addLogarithms(metrics[i], values.ratios[bit]);
        addLogarithms(metrics[half + i], positive);
    }
    for (std::size_t n = 0; n < chunk; ++n) {
        values.ratios[bit][n] -= positive[n];
    }
    if constexpr (bits > 1) {
        for (unsigned i = 0; i < half; ++i) {
            addLogarithms(metrics[2 * half - 1 - i], metrics[i]);
        }
        exactBits<bits - 1>(metrics, bit + 1, values);
    }
}

template <unsigned bits>
void exactChunk(Chunk& values)
{
    constexpr unsigned levels = 1U << bits;
    Numbers metrics[levels];
    for (unsigned i = 0; i < levels; ++i) {
        const float level = static_cast<float>(2 * i) - static_cast<float>(levels - 1);
        for (std::size_t n = 0; n < chunk; ++n) {
            metrics[i][n] = values.x[n] * level - values.energy[n] * (level * level);
        }
    }
    exactBits<bits>(metrics, 0, values);
}

/// One bit of a dimension has the same ratio by all levels and by the nearest.
void ratiosOfTwoLevels(const DimensionRow& row, float* ratios)
{
    const std::size_t count = row.symbols * row.across;
    const float slope = 2 * row.slope;
    if (row.gains == nullptr) {
        for (std::size_t n = 0; n < count; ++n) {
            ratios[n] = 0 - row.received[n] * slope;
        }
    } else if (row.across == 1) {
        for (std::size_t n = 0; n < count; ++n) {
            ratios[n] = 0 - row.received[n] * (slope * row.gains[n]);
        }
    } else {
        for (std::size_t s = 0; s < row.symbols; ++s) {
            const float slopeThere = slope * row.gains[s];
            ratios[2 * s] = 0 - row.received[2 * s] * slopeThere;
            ratios[2 * s + 1] = 0 - row.received[2 * s + 1] * slopeThere;
        }
    }
}

/// Several bits of each of two dimensions. Of the nearest levels, neighbours are 8 energies apart.
template <unsigned bits, bool isExact>
void ratiosOf(const DimensionRow& row, float* ratios)
{
    const std::size_t count = 2 * row.symbols;
    Chunk values = {};
    for (std::size_t first = 0; first < count; first += chunk) {
        const std::size_t now = count - first < chunk ? count - first : chunk;
        if constexpr (isExact) {
            load(row, first, now, row.slope, row.energy, values);
            exactChunk<bits>(values);
        } else {
            load(row, first, now, 2 * row.slope, 8 * row.energy, values);
            maxLogChunk<bits>(values, 0);
        }
        store<bits>(values, now, ratios + first * bits);
    }
}

template <bool isExact>
void ratios(const DimensionRow& row, float* to)
{
    switch (row.bits) {
    case 1:
        return ratiosOfTwoLevels(row, to);
    case 2:
        return ratiosOf<2, isExact>(row, to);
    case 3:
        return ratiosOf<3, isExact>(row, to);
    default:
        return ratiosOf<4, isExact>(row, to);
    }
}

}  // namespace

namespace MORVIK_LINK_SET {

extern const RowKernels kernels;
const RowKernels kernels = {MORVIK_LINK_SET_NAME,
                            add,
                            addClipped,
                            addNoise,
                            roundTo<std::int8_t>,
                            roundTo<std::int16_t>,
                            amplitudes,
                            fade,
                            map,
                            rowsOfOne,
                            rowsOfTwo,
                            ratios<false>,
                            ratios<true>,
                            logsOnePlusExp};

}  // namespace MORVIK_LINK_SET

}  // namespace morvik::link

// Evidence: how well soft values agree with the code word of the bits sent, for all mistakes at once.
#include "Evidence.h"

#include <algorithm>
#include <cmath>

#include "link/coding/TurboEncoder.h"
#include "rules/BlockSizes.h"

namespace morvik::diagnosis {

namespace {

using Stream = std::vector<std::int32_t>;

/// 1 for a value that favours the bit, -1 for one that contradicts it.
int agreement(std::int32_t value, std::uint8_t bit)
{
    const int sign = (value > 0 ? 1 : 0) - (value < 0 ? 1 : 0);
    return bit != 0 ? sign : -sign;
}

using TailSums = std::array<long long, rules::tailValues>;

/// Sums of agreements, which give those of any columns, signs and tail, as each value's agreement is independent of the
/// others.
struct Agreements {
    std::array<std::array<long long, 3>, 3> data{};  ///< [column of the file][stream]
    std::array<TailSums, rules::tailValues> tail{};  ///< [place of the file's tail][the standard's place]
    long long all = 0;                               ///< values

    void add(const Case& block)
    {
        const auto bits = encoded(block.sent);
        const std::array<const Stream*, 3> columns{
            &block.received.rsc1Sys, &block.received.rsc1Par, &block.received.rsc2Par};
        const std::size_t K = block.sent.size();
        for (std::size_t column = 0; column < 3; ++column) {
            for (std::size_t stream = 0; stream < 3; ++stream) {
                for (std::size_t k = 0; k < K; ++k) {
                    data[column][stream] += agreement((*columns[column])[k], bits[stream][k]);
                }
            }
        }
        for (std::size_t place = 0; place < rules::tailValues; ++place) {
            for (std::size_t right = 0; right < rules::tailValues; ++right) {
                tail[place][right] += agreement((*columns[place % 3])[K + place / 3], bits[right % 3][K + right / 3]);
            }
        }
        all += static_cast<long long>(3 * (K + tailRows));
    }

    /// The agreement of a column of the file, with signs as they are.
    long long of(std::size_t column, const Mistakes& mistakes) const
    {
        const std::size_t stream = columnContents[mistakes.columns][column];
        long long sum = data[column][stream];
        for (std::size_t row = 0; row < tailRows; ++row) {
            sum += tail[3 * row + column][tailContents[mistakes.tail][3 * row + stream]];
        }
        return sum;
    }

    Signs of(const Mistakes& mistakes) const
    {
        long long sum = 0;
        for (std::size_t column = 0; column < 3; ++column) {
            sum += (mistakes.flipped >> column & 1) != 0 ? -of(column, mistakes) : of(column, mistakes);
        }
        return {static_cast<double>(all - sum) / 2, static_cast<double>(all)};
    }
};

/// Appends all combinations of columns, signs and tails for the given rows and order.
void append(const std::vector<Case>& cases, Mistakes mistakes, std::vector<Suspicion>& suspicions)
{
    Agreements agreements;
    for (const Case& block : cases) {
        Case ordered = cut(block, mistakes);
        restoreOrder(ordered, mistakes.order);
        agreements.add(ordered);
    }
    const std::size_t tails = mistakes.rows == Rows::tailMissing ? 1 : tailContents.size();
    for (mistakes.columns = 0; mistakes.columns < columnContents.size(); ++mistakes.columns) {
        for (mistakes.flipped = 0; mistakes.flipped < 8; ++mistakes.flipped) {
            for (mistakes.tail = 0; mistakes.tail < tails; ++mistakes.tail) {
                suspicions.push_back({mistakes, agreements.of(mistakes)});
            }
        }
    }
}

/// The mistakes of rows that the blocks' numbers of rows allow.
std::vector<Rows> rowsToTry(const std::vector<Case>& cases)
{
    bool fewer = false;
    bool more = false;
    for (const Case& block : cases) {
        fewer = fewer || block.received.size() < block.sent.size() + tailRows;
        more = more || block.received.size() > block.sent.size() + tailRows;
    }
    if (fewer) {
        return {Rows::tailMissing};
    }
    return more ? std::vector<Rows>{Rows::first, Rows::last, Rows::ends} : std::vector<Rows>{Rows::right};
}

void add(Signs& signs, std::int32_t value, std::uint8_t bit)
{
    signs.wrong += (1 - agreement(value, bit)) / 2.0;
    signs.all += 1;
}

}  // namespace

double Signs::certainty() const
{
    return all > 0 ? (all - 2 * wrong) / std::sqrt(all) : 0;
}

double Signs::odds(double probability) const
{
    const double p = std::clamp(probability, 1e-4, 0.5);
    return wrong * std::log(2 * p) + (all - wrong) * std::log(2 * (1 - p));
}

double Signs::odds() const
{
    return odds(fraction());
}

double weightOf(const Signs& fewest)
{
    const double fraction = std::clamp((fewest.wrong + 1) / (fewest.all + 2), 1e-4, 0.49);
    return std::log((1 - fraction) / fraction);
}

std::vector<Suspicion> suspicions(const std::vector<Case>& cases)
{
    std::vector<Suspicion> found;
    for (const Rows rows : rowsToTry(cases)) {
        for (const Order order : allOrders) {
            Mistakes mistakes;
            mistakes.rows = rows;
            mistakes.order = order;
            append(cases, mistakes, found);
        }
    }
    return found;
}

std::vector<Suspicion> suspicionsOfSmallerSizes(const std::vector<Case>& cases)
{
    std::vector<Suspicion> found;
    for (const rules::BlockSize& size : rules::blockSizes) {
        if (size.K < cases.front().sent.size()) {
            Mistakes mistakes;
            mistakes.rows = Rows::smaller;
            mistakes.smallerSize = size.K;
            append(cases, mistakes, found);
        }
    }
    return found;
}

Signs Appearance::all() const
{
    Signs sum = tail;
    for (const Signs& stream : streams) {
        sum.wrong += stream.wrong;
        sum.all += stream.all;
    }
    return sum;
}

Signs Appearance::others(std::size_t stream) const
{
    Signs sum;
    for (std::size_t other = 0; other < streams.size(); ++other) {
        if (other != stream) {
            sum.wrong += streams[other].wrong;
            sum.all += streams[other].all;
        }
    }
    return sum;
}

Appearance appearanceOf(const std::vector<Case>& cases)
{
    Appearance appearance;
    for (const Case& block : cases) {
        const auto bits = encoded(block.sent);
        const std::array<const Stream*, 3> streams{
            &block.received.rsc1Sys, &block.received.rsc1Par, &block.received.rsc2Par};
        for (std::size_t stream = 0; stream < 3; ++stream) {
            for (std::size_t k = 0; k < bits[stream].size(); ++k) {
                const std::int32_t value = (*streams[stream])[k];
                add(k < block.sent.size() ? appearance.streams[stream] : appearance.tail, value, bits[stream][k]);
                appearance.amplitude += bits[stream][k] != 0 ? value : -static_cast<double>(value);
                appearance.power += static_cast<double>(value) * value;
            }
        }
    }
    const double values = std::max(appearance.all().all, 1.0);
    appearance.amplitude /= values;
    appearance.power /= values;
    return appearance;
}

std::array<std::vector<std::uint8_t>, 3> encoded(const std::vector<std::uint8_t>& bits)
{
    link::TurboEncoder encoder(static_cast<unsigned>(bits.size()));
    link::PackedBlocks information{encoder.words(), std::vector<std::uint64_t>(encoder.words())};
    for (std::size_t k = 0; k < bits.size(); ++k) {
        information.bits[k / 64] |= static_cast<std::uint64_t>(bits[k] & 1U) << k % 64;
    }
    link::TurboEncoder::Streams packed;
    encoder.encode(information, 1, packed);
    std::array<std::vector<std::uint8_t>, 3> streams;
    for (std::size_t stream = 0; stream < 3; ++stream) {
        for (std::size_t k = 0; k < bits.size() + tailRows; ++k) {
            streams[stream].push_back(static_cast<std::uint8_t>(packed[stream].bits[k / 64] >> k % 64 & 1));
        }
    }
    return streams;
}

}  // namespace morvik::diagnosis

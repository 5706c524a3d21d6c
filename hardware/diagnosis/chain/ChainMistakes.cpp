// ChainMistakes: what goes wrong with transport blocks between code words and soft values.
#include "ChainMistakes.h"

#include <algorithm>
#include <numeric>

#include "rules/Tail.h"

namespace morvik::diagnosis {

namespace {

constexpr unsigned columns = 32;

/// The column that is read as number i (Table 5.1.4-1): the bits of i reversed.
unsigned columnOf(unsigned i)
{
    return (i & 1) << 4 | (i & 2) << 2 | (i & 4) | (i & 8) >> 2 | (i & 16) >> 4;
}

/// The order in which the positions of the interleaver's matrix, counted row by row, are read.
std::vector<unsigned> readingOrder(unsigned rows, Interleaver interleaver)
{
    std::vector<unsigned> order(std::size_t{columns} * rows);
    std::iota(order.begin(), order.end(), 0U);
    if (interleaver == Interleaver::byRows) {
        return order;
    }
    for (unsigned k = 0; k < order.size(); ++k) {
        const unsigned column = interleaver == Interleaver::naturalColumns ? k / rows : columnOf(k / rows);
        order[k] = column + columns * (k % rows);
    }
    return order;
}

/// The streams of the circular buffer, as numbers of stream and place in the reading order.
struct Slot {
    unsigned stream;
    unsigned k;
};

Slot slotOf(unsigned position, unsigned size, BufferOrder order)
{
    if (order == BufferOrder::systematicLast) {
        position = position < 2 * size ? position + size : position - 2 * size;
    }
    if (position < size) {
        return {0, position};
    }
    position -= size;
    switch (order) {
    case BufferOrder::paritiesSwapped:
        return {2 - position % 2, position / 2};
    case BufferOrder::paritiesApart:
        return {1 + position / size, position % size};
    case BufferOrder::right:
    case BufferOrder::systematicLast:
        break;
    }
    return {1 + position % 2, position / 2};
}

/// Of the bit at each place of a symbol: its number in the standard's order.
std::vector<unsigned> bitsAtPlaces(unsigned perSymbol, SymbolOrder order)
{
    std::vector<unsigned> bits(perSymbol);
    for (unsigned place = 0; place < perSymbol; ++place) {
        switch (order) {
        case SymbolOrder::right:
            bits[place] = place;
            break;
        case SymbolOrder::reversed:
            bits[place] = perSymbol - 1 - place;
            break;
        case SymbolOrder::swapped:
            bits[place] = place ^ 1U;
            break;
        case SymbolOrder::separated:
            bits[place] = place < perSymbol / 2 ? 2 * place : 2 * place + 1 - perSymbol;
            break;
        case SymbolOrder::levelsLast:
            bits[place] = (perSymbol - 2 - place / 2 * 2) + place % 2;
            break;
        }
    }
    return bits;
}

bool isFlipped(unsigned bit, Flip flip)
{
    switch (flip) {
    case Flip::none:
        return false;
    case Flip::all:
        return true;
    case Flip::levels:
        return bit >= 2;
    case Flip::inPhase:
        return bit % 2 == 0;
    case Flip::quadrature:
        return bit % 2 == 1;
    }
    return false;
}

template <class Member, class Value>
std::vector<ChainMistakes> alternatives(Member ChainMistakes::*member, std::initializer_list<Value> values)
{
    std::vector<ChainMistakes> list;
    for (const Value value : values) {
        list.emplace_back();
        list.back().*member = value;
    }
    return list;
}

// ---- Words

Explanation explain(Interleaver interleaver)
{
    const std::string order =
        "Read the columns of the sub-block interleaver in the order of Table 5.1.4-1 of 3GPP TS "
        "36.212: 0, 16, 8, 24, ...";
    switch (interleaver) {
    case Interleaver::naturalColumns:
        return {"interleaver", "the columns of the sub-block interleaver are not permuted", order};
    case Interleaver::byRows:
        return {"interleaver",
                "the sub-block interleaver is left out, or read by rows",
                "Write it row by row, read it column by column (3GPP TS 36.212, clause 5.1.4.1.1)."};
    case Interleaver::sameParities:
        return {"interleaver",
                "the second parity is read from the sub-block interleaver as the first",
                "Read it one position later: (... + 1) mod K_pi in clause 5.1.4.1.1 of 3GPP TS 36.212."};
    case Interleaver::dummiesLast:
        return {"interleaver",
                "the dummy bits of the sub-block interleaver stand at its end",
                "Write them first, before the stream (3GPP TS 36.212, clause 5.1.4.1.1)."};
    case Interleaver::right:
        break;
    }
    return {};
}

Explanation explain(BufferOrder order)
{
    const std::string change =
        "The circular buffer has the systematic stream, then both parities alternately, the first one first (3GPP TS "
        "36.212, clause 5.1.4.1.2).";
    switch (order) {
    case BufferOrder::paritiesSwapped:
        return {"buffer", "the parities are swapped in the circular buffer", change};
    case BufferOrder::paritiesApart:
        return {"buffer", "the parities stand one after the other in the circular buffer, not alternately", change};
    case BufferOrder::systematicLast:
        return {"buffer", "the systematic stream stands behind the parities in the circular buffer", change};
    case BufferOrder::right:
        break;
    }
    return {};
}

Explanation explain(Split split)
{
    if (split == Split::longerFirst) {
        return {
            "split",
            "the first code blocks, not the last, have a symbol more",
            "With G' symbols for C code blocks, the last G' mod C have one more (3GPP TS 36.212, clause 5.1.4.1.2)."};
    }
    return {"split", "the code blocks are concatenated backwards", "Write the first code block first."};
}

Explanation explain(SymbolOrder order)
{
    const std::string change =
        "The bits of a symbol are those of I and Q in turn, the signs first (3GPP TS 36.211, "
        "clause 7.1).";
    switch (order) {
    case SymbolOrder::reversed:
        return {"symbol", "the bits of each symbol are reversed", change};
    case SymbolOrder::swapped:
        return {"symbol", "I and Q are swapped", change};
    case SymbolOrder::separated:
        return {"symbol", "each symbol has all bits of I before those of Q", change};
    case SymbolOrder::levelsLast:
        return {"symbol", "each symbol has its signs last", change};
    case SymbolOrder::right:
        break;
    }
    return {};
}

Explanation explain(Flip flip)
{
    const std::string change = "A positive value favours bit 1: ln(P(1) / P(0)).";
    switch (flip) {
    case Flip::all:
        return {"sign", "the sign of all values is flipped", "Negate them. " + change};
    case Flip::levels:
        return {"sign",
                "the sign of the values of all bits but the first two of each symbol is flipped",
                "Negate those that tell the amplitudes. " + change};
    case Flip::inPhase:
        return {"sign", "the sign of the values of I is flipped", "Negate them. " + change};
    case Flip::quadrature:
        return {"sign", "the sign of the values of Q is flipped", "Negate them. " + change};
    case Flip::none:
        break;
    }
    return {};
}

Explanation explainVersion(std::size_t transmission, unsigned sent, unsigned said)
{
    return {"version",
            "transmission " + std::to_string(transmission + 1) + " has redundancy version " + std::to_string(sent) +
                ", not " + std::to_string(said),
            "Say so in --redundancy-versions, or send version " + std::to_string(said) + "."};
}

Explanation explainBuffer(const ChainMistakes& mistakes, unsigned count)
{
    const auto range = [](std::uint64_t from, std::uint64_t to) {
        return std::to_string(from) + (from < to ? " to " + std::to_string(to) : "");
    };
    const std::uint64_t from = std::uint64_t{mistakes.bufferSize.from} * count;
    const std::uint64_t to = std::uint64_t{mistakes.bufferSize.to} * count + count - 1;
    return {"soft_buffer",
            "the circular buffer has N_cb = " + range(mistakes.bufferSize.from, mistakes.bufferSize.to) + " positions",
            "Both sides need the same soft buffer: --soft-buffer-size " + range(from, to) + " is the sender's (N_IR)."};
}

Explanation explainScale(int doublings)
{
    const std::string factor = std::to_string(std::uint64_t{1} << std::min(std::abs(doublings), 62));
    return {"scale",
            std::string("the demapper's values are about ") + factor + " times too " +
                (doublings < 0 ? "small" : "large") + " for this scale",
            std::string(doublings < 0 ? "Multiply" : "Divide") + " --scale by " + factor + "."};
}

}  // namespace

link::TransportFormat codingOf(const ChainFormat& format)
{
    return {format.bits, format.codedBits, bitsPerSymbol(format.modulation), 1, format.softBufferSize};
}

unsigned ChainMistakes::count(const ChainFormat& format) const
{
    unsigned count = 0;
    for (std::size_t t = 0; t < versions.size(); ++t) {
        count += versions[t] != format.versions[t] ? 1U : 0U;
    }
    for (const bool made : {bufferSize.best != 0,
                            fillersSent,
                            interleaver != Interleaver::right,
                            buffer != BufferOrder::right,
                            noOffset,
                            split != Split::right,
                            symbol != SymbolOrder::right,
                            flip != Flip::none,
                            doublings != 0}) {
        count += made ? 1U : 0U;
    }
    return count;
}

std::vector<std::vector<ChainMistakes>> kindsOfMistakes(const ChainFormat& format)
{
    const link::CodeBlocks blocks = link::codeBlocksOf(format.bits);
    std::vector<std::vector<ChainMistakes>> kinds = {
        alternatives(
            &ChainMistakes::interleaver,
            {Interleaver::naturalColumns, Interleaver::byRows, Interleaver::sameParities, Interleaver::dummiesLast}),
        alternatives(&ChainMistakes::buffer,
                     {BufferOrder::paritiesSwapped, BufferOrder::paritiesApart, BufferOrder::systematicLast}),
        alternatives(&ChainMistakes::noOffset, {true})};
    if (blocks.fillers > 0) {
        kinds.push_back(alternatives(&ChainMistakes::fillersSent, {true}));
    }
    const unsigned perSymbol = bitsPerSymbol(format.modulation);
    if (blocks.count > 1) {
        kinds.push_back(alternatives(&ChainMistakes::split, {Split::backwards}));
        if (format.codedBits / perSymbol % blocks.count != 0) {
            kinds.back().push_back(alternatives(&ChainMistakes::split, {Split::longerFirst}).front());
        }
    }
    if (perSymbol > 2) {
        kinds.push_back(alternatives(
            &ChainMistakes::symbol,
            {SymbolOrder::swapped, SymbolOrder::reversed, SymbolOrder::separated, SymbolOrder::levelsLast}));
        kinds.push_back(alternatives(&ChainMistakes::flip, {Flip::all, Flip::levels, Flip::inPhase, Flip::quadrature}));
    } else if (perSymbol == 2) {
        kinds.push_back(alternatives(&ChainMistakes::symbol, {SymbolOrder::swapped}));
        kinds.push_back(alternatives(&ChainMistakes::flip, {Flip::all, Flip::inPhase, Flip::quadrature}));
    } else {
        kinds.push_back(alternatives(&ChainMistakes::flip, {Flip::all}));
    }
    return kinds;
}

ChainMistakes joined(ChainMistakes one, const ChainMistakes& other)
{
    const auto take = [](auto& to, const auto& from) {
        if (from != std::decay_t<decltype(from)>{}) {
            to = from;
        }
    };
    take(one.versions, other.versions);
    one.bufferSize = other.bufferSize.best != 0 ? other.bufferSize : one.bufferSize;
    take(one.fillersSent, other.fillersSent);
    take(one.interleaver, other.interleaver);
    take(one.buffer, other.buffer);
    take(one.noOffset, other.noOffset);
    take(one.split, other.split);
    take(one.symbol, other.symbol);
    take(one.flip, other.flip);
    take(one.doublings, other.doublings);
    return one;
}

std::vector<ChainMistakes> withoutOne(const ChainMistakes& mistakes, const ChainFormat& format)
{
    std::vector<ChainMistakes> fewer;
    const auto add = [&](const auto& put) {
        ChainMistakes one = mistakes;
        put(one);
        if (one.count(format) < mistakes.count(format)) {
            fewer.push_back(one);
        }
    };
    for (std::size_t t = 0; t < mistakes.versions.size(); ++t) {
        add([&](ChainMistakes& one) { one.versions[t] = format.versions[t]; });
    }
    const ChainMistakes none;
    const auto addWithout = [&](auto... members) {
        (add([&](ChainMistakes& one) { one.*members = none.*members; }), ...);
    };
    addWithout(&ChainMistakes::bufferSize,
               &ChainMistakes::fillersSent,
               &ChainMistakes::interleaver,
               &ChainMistakes::buffer,
               &ChainMistakes::noOffset,
               &ChainMistakes::split,
               &ChainMistakes::symbol,
               &ChainMistakes::flip,
               &ChainMistakes::doublings);
    return fewer;
}

std::vector<ChainMistakes> combinationsOf(const std::vector<std::vector<ChainMistakes>>& kinds, bool inPairs)
{
    std::vector<ChainMistakes> all;
    for (std::size_t one = 0; one < kinds.size(); ++one) {
        if (!inPairs) {
            all.insert(all.end(), kinds[one].begin(), kinds[one].end());
            continue;
        }
        for (std::size_t other = one + 1; other < kinds.size(); ++other) {
            for (const ChainMistakes& a : kinds[one]) {
                for (const ChainMistakes& b : kinds[other]) {
                    all.push_back(joined(a, b));
                }
            }
        }
    }
    return all;
}

std::vector<Explanation> explain(const ChainMistakes& mistakes, const ChainFormat& format)
{
    std::vector<Explanation> all;
    for (std::size_t t = 0; t < mistakes.versions.size(); ++t) {
        if (mistakes.versions[t] != format.versions[t]) {
            all.push_back(explainVersion(t, mistakes.versions[t], format.versions[t]));
        }
    }
    const auto add = [&all](bool isMade, auto explanation) {
        if (isMade) {
            all.push_back(explanation());
        }
    };
    add(mistakes.bufferSize.best != 0, [&] { return explainBuffer(mistakes, link::codeBlocksOf(format.bits).count); });
    add(mistakes.fillersSent, [] {
        return Explanation{"fillers",
                           "filler bits are taken as data",
                           "Pass over filler bits in the circular buffer, and give the decoder the strongest 0 for "
                           "each (3GPP TS 36.212, clauses 5.1.3.2.1 and 5.1.4.1.2)."};
    });
    add(mistakes.interleaver != Interleaver::right, [&] { return explain(mistakes.interleaver); });
    add(mistakes.buffer != BufferOrder::right, [&] { return explain(mistakes.buffer); });
    add(mistakes.noOffset, [] {
        return Explanation{"offset",
                           "redundancy versions start two columns too early",
                           "k_0 = R (2 ceil(N_cb / (8 R)) rv + 2): add its constant part, 2 R."};
    });
    add(mistakes.split != Split::right, [&] { return explain(mistakes.split); });
    add(mistakes.symbol != SymbolOrder::right, [&] { return explain(mistakes.symbol); });
    add(mistakes.flip != Flip::none, [&] { return explain(mistakes.flip); });
    add(mistakes.doublings != 0, [&] { return explainScale(mistakes.doublings); });
    return all;
}

WholeBuffer::WholeBuffer(unsigned K, unsigned fillers, const ChainMistakes& mistakes)
    : itsRows((K + rules::tailPositions + columns - 1) / columns), itsHasOffset(!mistakes.noOffset), itsBefore{0}
{
    const unsigned length = K + rules::tailPositions;
    const unsigned size = columns * itsRows;
    const unsigned dummies = mistakes.interleaver == Interleaver::dummiesLast ? 0 : size - length;
    const std::vector<unsigned> order = readingOrder(itsRows, mistakes.interleaver);
    const bool isShifted =
        mistakes.interleaver != Interleaver::byRows && mistakes.interleaver != Interleaver::sameParities;
    for (unsigned position = 0; position < 3 * size; ++position) {
        const auto [stream, k] = slotOf(position, size, mistakes.buffer);
        const unsigned written = (order[k] + (stream == 2 && isShifted ? 1 : 0)) % size;
        const bool isDummy = written < dummies || written - dummies >= length;
        const bool isFiller = !isDummy && stream < 2 && written - dummies < fillers && !mistakes.fillersSent;
        if (!isDummy && !isFiller) {
            itsPlaces.push_back(static_cast<std::uint16_t>(stream * length + written - dummies));
        }
        itsBefore.push_back(static_cast<unsigned>(itsPlaces.size()));
    }
}

std::array<unsigned, link::redundancyVersions> WholeBuffer::starts(unsigned size) const
{
    std::array<unsigned, link::redundancyVersions> starts{};
    for (unsigned version = 0; version < starts.size(); ++version) {
        const unsigned eighths = (size + 8 * itsRows - 1) / (8 * itsRows);
        const unsigned k0 = itsRows * (2 * eighths * version + (itsHasOffset ? 2 : 0));
        starts[version] = itsBefore[k0 % size] % std::max(itsBefore[size], 1U);
    }
    return starts;
}

CircularBuffer WholeBuffer::limited(unsigned size) const
{
    return {{itsPlaces.begin(), itsPlaces.begin() + static_cast<std::ptrdiff_t>(bits(size))}, starts(size)};
}

unsigned bufferSizeOf(const ChainFormat& format, const ChainMistakes& mistakes, unsigned count, unsigned whole)
{
    const unsigned said = format.softBufferSize == link::unlimitedBuffer ? whole : format.softBufferSize / count;
    return std::min(mistakes.bufferSize.best != 0 ? mistakes.bufferSize.best : said, whole);
}

std::vector<Part> partsOf(const link::TransportBlockCode& code, Split split)
{
    const unsigned count = code.blocks().count;
    std::vector<Part> parts(count);
    unsigned first = 0;
    for (unsigned i = 0; i < count; ++i) {
        const unsigned r = split == Split::backwards ? count - 1 - i : i;
        // The last blocks are the longer ones, if any.
        parts[r] = {first, code.codedBits(split == Split::longerFirst ? count - 1 - r : r)};
        first += parts[r].count;
    }
    return parts;
}

template <class Value>
std::vector<Value> restoredSymbols(const std::vector<Value>& values,
                                   link::Modulation modulation,
                                   const ChainMistakes& mistakes)
{
    const unsigned perSymbol = bitsPerSymbol(modulation);
    const std::vector<unsigned> bits = bitsAtPlaces(perSymbol, mistakes.symbol);
    std::vector<Value> restored(values.size());
    for (std::size_t i = 0; i < values.size(); ++i) {
        const unsigned bit = bits[i % perSymbol];
        const Value value = values[i];
        restored[i - i % perSymbol + bit] = isFlipped(bit, mistakes.flip) ? static_cast<Value>(-value) : value;
    }
    return restored;
}

template std::vector<float> restoredSymbols(const std::vector<float>&, link::Modulation, const ChainMistakes&);
template std::vector<std::int8_t> restoredSymbols(const std::vector<std::int8_t>&,
                                                  link::Modulation,
                                                  const ChainMistakes&);

}  // namespace morvik::diagnosis

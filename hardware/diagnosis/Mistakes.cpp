// Mistakes: what goes wrong with soft values between an encoder and a file, and how to undo it.
#include "Mistakes.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>

namespace morvik::diagnosis {

namespace {

using SoftStream = std::vector<std::int32_t>;

constexpr const char* columnNames[] = {"rsc1_sys", "rsc1_par", "rsc2_par"};

std::array<SoftStream*, 3> streamsOf(SoftBlock& block)
{
    return {&block.rsc1Sys, &block.rsc1Par, &block.rsc2Par};
}

/// `size` rows of the streams from `first` on, with zeros for missing ones.
SoftBlock rowsOf(SoftBlock block, std::size_t first, std::size_t size)
{
    for (SoftStream* stream : streamsOf(block)) {
        stream->erase(stream->begin(), stream->begin() + static_cast<std::ptrdiff_t>(first));
        stream->resize(size);
    }
    return block;
}

/// Reverses the bits of each byte; a partial byte at the end is reversed by itself.
void reverseBytes(std::vector<std::uint8_t>& bits)
{
    for (std::size_t first = 0; first < bits.size(); first += 8) {
        const std::size_t end = std::min(first + 8, bits.size());
        std::reverse(bits.begin() + static_cast<std::ptrdiff_t>(first),
                     bits.begin() + static_cast<std::ptrdiff_t>(end));
    }
}

void restoreTail(SoftBlock& block, const TailContents& contents)
{
    const std::size_t K = block.size() - tailRows;
    const auto streams = streamsOf(block);
    std::array<std::int32_t, rules::tailValues> values{};
    for (std::size_t place = 0; place < contents.size(); ++place) {
        values[contents[place]] = (*streams[place % 3])[K + place / 3];
    }
    for (std::size_t place = 0; place < contents.size(); ++place) {
        (*streams[place % 3])[K + place / 3] = values[place];
    }
}

/// Divides by 2^doublings and rounds; the result is clipped as the decoder clips.
std::int32_t scaled(std::int32_t value, int doublings)
{
    return static_cast<std::int32_t>(std::clamp(std::nearbyint(std::ldexp(value, -doublings)), -128.0, 127.0));
}

std::string namesOf(unsigned columns)
{
    std::string names;
    for (unsigned column = 0; column < 3; ++column) {
        if ((columns >> column & 1) != 0) {
            names += (names.empty() ? "" : " and ") + std::string(columnNames[column]);
        }
    }
    return names;
}

Explanation explain(Rows rows, std::size_t smallerSize)
{
    switch (rows) {
    case Rows::right:
        break;
    case Rows::tailMissing:
        return {"tail_missing",
                "the tail is missing: a block of K bits has K + 4 rows",
                "Write the twelve tail values into four more rows; zeros if they are not known."};
    case Rows::first:
        return {"rows_behind", "there are extra rows after the block", "Write only the first K + 4 rows."};
    case Rows::last:
        return {"rows_before", "there are extra rows before the block", "Write only the last K + 4 rows."};
    case Rows::ends:
        return {"rows_between",
                "there are extra rows between data and tail",
                "Write only the first K rows and the last four."};
    case Rows::smaller:
        break;
    }
    const std::string K = std::to_string(smallerSize);
    return {"size",
            "the block is one of " + K + " bits, padded to more",
            "Write " + std::to_string(smallerSize + tailRows) + " rows, and a reference of " + K + " bits."};
}

Explanation explain(Order order)
{
    switch (order) {
    case Order::right:
    case Order::rowsReversed:
        break;
    case Order::dataReversed:
        return {"data_reversed",
                "the data rows are reversed, the tail rows are not",
                "Start with the row of the bit that was encoded first."};
    case Order::sentReversed:
        return {"reference_reversed",
                "the bits of the reference are reversed",
                "Encode and compare in one order: reverse each line of the reference if the encoder is right."};
    case Order::sentByteReversed:
        return {"reference_bytes_reversed",
                "the bits of each byte of the reference are reversed",
                "Unpack bytes in the order in which the encoder takes their bits (3GPP: most significant bit first)."};
    case Order::sentInverted:
        return {"reference_inverted", "the reference has 0 for 1 and 1 for 0", "Invert the bits of the reference."};
    }
    return {"rows_reversed", "the rows are reversed, tail first", "Write the last row first."};
}

Explanation explainColumns(const std::array<std::uint8_t, 3>& contents)
{
    std::string found;
    std::string unmoved;
    for (std::size_t column = 0; column < 3; ++column) {
        found += (column == 0 ? "" : ", ") + std::string(columnNames[contents[column]]);
        unmoved = contents[column] == column ? columnNames[column] : unmoved;
    }
    if (unmoved.empty()) {
        return {"columns", "the columns are " + found, "Write the columns as the header names them."};
    }
    std::string swapped;
    for (std::size_t column = 0; column < 3; ++column) {
        if (contents[column] != column) {
            swapped += (swapped.empty() ? "" : " and ") + std::string(columnNames[column]);
        }
    }
    return {"columns", swapped + " are swapped", "Swap the columns " + swapped + '.'};
}

Explanation explainTail(std::size_t tail)
{
    const char* const layouts[] = {"",
                                   "the tail continues each stream: x z z' of each step, then x' x' x'",
                                   "the tail is written column by column",
                                   "the tail is written as x x x z z z, row by row",
                                   "the tail is written as x x x z z z, column by column",
                                   "the tail has the second encoder's values first"};
    return {"tail",
            layouts[tail],
            "Write the last four rows as x z x | z x z | x' z' x' | z' x' z' (3GPP TS 36.212, clause 5.1.3.2.2)."};
}

Explanation explainScale(int doublings)
{
    const std::string factor = std::to_string(1LL << std::abs(doublings));
    if (doublings < 0) {
        return {"scale",
                "the scale is missing or too small: values are about " + factor + " times too small",
                "Multiply by " + factor + " before rounding: the amplitude in the file should be 8."};
    }
    return {"scale",
            "the scale is doubled or too large: values are about " + factor + " times too large",
            "Divide by " + factor + ": the amplitude in the file should be 8."};
}

}  // namespace

unsigned Mistakes::count() const
{
    unsigned count = 0;
    for (const bool made :
         {rows != Rows::right, order != Order::right, columns != 0, flipped != 0, tail != 0, doublings != 0}) {
        count += made ? 1 : 0;
    }
    return count;
}

std::vector<Explanation> explain(const Mistakes& mistakes)
{
    std::vector<Explanation> all;
    if (mistakes.rows != Rows::right) {
        all.push_back(explain(mistakes.rows, mistakes.smallerSize));
    }
    if (mistakes.order != Order::right) {
        all.push_back(explain(mistakes.order));
    }
    if (mistakes.columns != 0) {
        all.push_back(explainColumns(columnContents[mistakes.columns]));
    }
    if (mistakes.flipped == 7) {
        all.push_back({"sign",
                       "the sign of all soft values is flipped",
                       "Negate all three columns: a positive value favours bit 1."});
    } else if (mistakes.flipped != 0) {
        const std::string names = namesOf(mistakes.flipped);
        all.push_back({"sign",
                       "the sign of " + names + " is flipped",
                       "Negate " + names + ": a positive value favours bit 1 in every column."});
    }
    if (mistakes.tail != 0) {
        all.push_back(explainTail(mistakes.tail));
    }
    if (mistakes.doublings != 0) {
        all.push_back(explainScale(mistakes.doublings));
    }
    return all;
}

Case cut(const Case& block, const Mistakes& mistakes)
{
    const std::size_t K = mistakes.rows == Rows::smaller ? mistakes.smallerSize : block.sent.size();
    const std::size_t rows = block.received.size();
    Case cut = block;
    if (mistakes.rows == Rows::right || rows == K + tailRows) {
        return cut;
    }
    cut.sent.resize(K);
    if (mistakes.rows == Rows::tailMissing) {
        cut.received = rowsOf(rowsOf(cut.received, 0, K), 0, K + tailRows);
        return cut;
    }
    cut.received = rowsOf(cut.received, mistakes.rows == Rows::last ? rows - K - tailRows : 0, K + tailRows);
    if (mistakes.rows == Rows::ends) {
        SoftBlock tail = rowsOf(block.received, rows - tailRows, tailRows);
        const auto from = streamsOf(tail);
        const auto to = streamsOf(cut.received);
        for (std::size_t column = 0; column < 3; ++column) {
            std::copy(from[column]->begin(), from[column]->end(), to[column]->end() - tailRows);
        }
    }
    return cut;
}

void restoreOrder(Case& block, Order order)
{
    switch (order) {
    case Order::right:
        break;
    case Order::rowsReversed:
    case Order::dataReversed:
        for (SoftStream* stream : streamsOf(block.received)) {
            const std::ptrdiff_t unmoved = order == Order::dataReversed ? tailRows : 0;
            std::reverse(stream->begin(), stream->end() - unmoved);
        }
        break;
    case Order::sentReversed:
        std::reverse(block.sent.begin(), block.sent.end());
        break;
    case Order::sentByteReversed:
        reverseBytes(block.sent);
        break;
    case Order::sentInverted:
        for (std::uint8_t& bit : block.sent) {
            bit ^= 1;
        }
        break;
    }
}

Case undone(const Case& block, const Mistakes& mistakes)
{
    Case right = cut(block, mistakes);
    restoreOrder(right, mistakes.order);
    const auto columns = streamsOf(right.received);
    for (unsigned column = 0; column < 3; ++column) {
        const bool flipped = (mistakes.flipped >> column & 1) != 0;
        for (std::int32_t& value : *columns[column]) {
            const std::int32_t positive =
                flipped ? static_cast<std::int32_t>(0U - static_cast<std::uint32_t>(value)) : value;
            value = mistakes.doublings == 0 ? positive : scaled(positive, mistakes.doublings);
        }
    }
    const SoftBlock found = right.received;
    const std::array<const SoftStream*, 3> from{&found.rsc1Sys, &found.rsc1Par, &found.rsc2Par};
    for (std::size_t column = 0; column < 3; ++column) {
        *columns[columnContents[mistakes.columns][column]] = *from[column];
    }
    restoreTail(right.received, tailContents[mistakes.tail]);
    return right;
}

}  // namespace morvik::diagnosis

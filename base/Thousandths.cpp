// Thousandths: decimal numbers with three places, as integers, so that no result depends on rounding.
#include "Thousandths.h"

#include <algorithm>
#include <cstddef>
#include <cstdlib>

namespace morvik::base {

namespace {

constexpr std::size_t places = 3;
constexpr std::size_t longestWhole = 6;  // so that an int holds all thousandths

bool areDigits(std::string_view text)
{
    return std::all_of(text.begin(), text.end(), [](char c) { return c >= '0' && c <= '9'; });
}

}  // namespace

std::optional<int> parseThousandths(std::string_view text)
{
    const bool negative = !text.empty() && text.front() == '-';
    if (negative || (!text.empty() && text.front() == '+')) {
        text.remove_prefix(1);
    }
    const std::size_t point = std::min(text.find('.'), text.size());
    const std::string_view whole = text.substr(0, point);
    std::string_view fraction = text.substr(std::min(point + 1, text.size()));
    while (fraction.size() > places && fraction.back() == '0') {
        fraction.remove_suffix(1);
    }
    const bool empty = whole.empty() && fraction.empty();
    if (empty || whole.size() > longestWhole || fraction.size() > places || !areDigits(whole) || !areDigits(fraction)) {
        return std::nullopt;
    }
    int value = 0;
    for (const char digit : whole) {
        value = 10 * value + (digit - '0');
    }
    for (std::size_t i = 0; i < places; ++i) {
        value = 10 * value + (i < fraction.size() ? fraction[i] - '0' : 0);
    }
    return negative ? -value : value;
}

std::string thousandthsText(int thousandths)
{
    const int size = std::abs(thousandths);
    std::string fraction = std::to_string(1000 + size % 1000).substr(1);
    fraction.erase(fraction.find_last_not_of('0') + 1);
    return (thousandths < 0 ? "-" : "") + std::to_string(size / 1000) + (fraction.empty() ? "" : '.' + fraction);
}

}  // namespace morvik::base

// Wording: strings and figures as plots and pages show them, independent of the locale.
#include "Wording.h"

#include <algorithm>
#include <array>
#include <charconv>
#include <cmath>

#include "base/Numbers.h"
#include "base/Printable.h"

namespace morvik::report {

namespace {

bool isContinuation(char c)
{
    return (static_cast<unsigned char>(c) & 0xc0U) == 0x80U;
}

}  // namespace

std::string printable(std::string_view text)
{
    std::string result;
    while (!text.empty()) {
        const std::size_t length = base::lengthOfFirst(text);
        const bool isControl = length == 1 && (text[0] < ' ' || text[0] == '\x7f');
        if (length == 0 || isControl) {
            result += isControl ? ' ' : '?';
            text.remove_prefix(1);
        } else {
            result += text.substr(0, length);
            text.remove_prefix(length);
        }
    }
    return result;
}

std::string escaped(std::string_view text)
{
    std::string result;
    for (const char c : printable(text)) {
        switch (c) {
        case '&':
            result += "&amp;";
            break;
        case '<':
            result += "&lt;";
            break;
        case '>':
            result += "&gt;";
            break;
        case '"':
            result += "&quot;";
            break;
        case '\'':
            result += "&#39;";
            break;
        default:
            result += c;
        }
    }
    return result;
}

std::string shortened(const std::string& text, std::size_t most)
{
    if (characters(text) <= most) {
        return text;
    }
    std::size_t end = 0;
    for (std::size_t kept = 0; kept + 1 < most; ++kept) {
        ++end;
        while (isContinuation(text[end])) {
            ++end;
        }
    }
    return text.substr(0, end) + "\u2026";
}

std::size_t characters(std::string_view text)
{
    return text.size() - static_cast<std::size_t>(std::count_if(text.begin(), text.end(), isContinuation));
}

std::string decibels(double value)
{
    const bool needsThree = std::lround(value * 1000) % 10 != 0;
    const std::string digits = base::numberText(std::abs(value), std::chars_format::fixed, needsThree ? 3 : 2);
    return std::lround(value * 1000) < 0 ? "\u2212" + digits : digits;
}

std::string rate(double value)
{
    return base::numberText(value, std::chars_format::scientific, 2);
}

std::string grouped(std::uint64_t count)
{
    const std::string digits = std::to_string(count);
    std::string result;
    for (std::size_t i = 0; i < digits.size(); ++i) {
        if (i > 0 && (digits.size() - i) % 3 == 0) {
            result += "\u202f";
        }
        result += digits[i];
    }
    return result;
}

}  // namespace morvik::report

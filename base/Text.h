// Text: text helpers for readers and messages.
#ifndef MORVIK_BASE_TEXT_H
#define MORVIK_BASE_TEXT_H

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace morvik::base {

/// Written by some programs at the beginning of UTF-8 text.
constexpr std::string_view byteOrderMark = "\xEF\xBB\xBF";

inline std::string_view withoutMark(std::string_view text)
{
    return text.substr(0, byteOrderMark.size()) == byteOrderMark ? text.substr(byteOrderMark.size()) : text;
}

/// The text without leading and trailing blanks.
inline std::string_view trimmed(std::string_view text)
{
    constexpr std::string_view blanks = " \t\r";
    const std::size_t start = text.find_first_not_of(blanks);
    return start == std::string_view::npos ? std::string_view()
                                           : text.substr(start, text.find_last_not_of(blanks) - start + 1);
}

/// "block" for one, "blocks" for any other count.
inline std::string plural(const std::string& noun, std::uint64_t count)
{
    return count == 1 ? noun : noun + 's';
}

/// "1 block", "2 blocks".
inline std::string counted(std::uint64_t count, const std::string& noun)
{
    return std::to_string(count) + ' ' + plural(noun, count);
}

/// The text behind blanks, `width` characters in all.
inline std::string rightAligned(const std::string& text, std::size_t width)
{
    return std::string(width - std::min(width, text.size()), ' ') + text;
}

/// Lists ascending numbers by their names, neighbours as a range: "2 to 15", "alpha0 to alpha7, llr".
/// `continuesRange` tells whether a number may be in a range with the one before it.
template <class Name, class ContinuesRange>
std::string listed(const std::vector<unsigned>& numbers, Name name, ContinuesRange continuesRange)
{
    std::string text;
    for (std::size_t first = 0, last = 0; first < numbers.size(); first = ++last) {
        while (last + 1 < numbers.size() && numbers[last + 1] == numbers[last] + 1 &&
               continuesRange(numbers[last + 1])) {
            ++last;
        }
        text += (text.empty() ? "" : ", ") + name(numbers[first]);
        if (last > first) {
            text += (last > first + 1 ? " to " : ", ") + name(numbers[last]);
        }
    }
    return text;
}

}  // namespace morvik::base

#endif

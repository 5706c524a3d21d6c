// Text: text helpers for readers and messages.
#ifndef MORVIK_BASE_TEXT_H
#define MORVIK_BASE_TEXT_H

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace morvik::base {

/// Some programs write it at the beginning of UTF-8 text.
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

}  // namespace morvik::base

#endif

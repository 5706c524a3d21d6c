// Csv: what all comma-separated values have in common, from whatever program they come.
#ifndef MORVIK_BASE_CSV_H
#define MORVIK_BASE_CSV_H

#include <string_view>
#include <vector>

namespace morvik::base {

/// What some programs write before a text in UTF-8.
constexpr std::string_view byteOrderMark = "\xEF\xBB\xBF";

inline std::string_view withoutMark(std::string_view text)
{
    return text.substr(0, byteOrderMark.size()) == byteOrderMark ? text.substr(byteOrderMark.size()) : text;
}

/// The text without the blanks around it.
inline std::string_view trimmed(std::string_view text)
{
    constexpr std::string_view blanks = " \t\r";
    const std::size_t start = text.find_first_not_of(blanks);
    return start == std::string_view::npos ? std::string_view()
                                           : text.substr(start, text.find_last_not_of(blanks) - start + 1);
}

/// The texts between the commas, at least one, without the blanks around them.
inline std::vector<std::string_view> fieldsOf(std::string_view line)
{
    std::vector<std::string_view> fields;
    for (std::size_t comma = line.find(','); comma != std::string_view::npos; comma = line.find(',')) {
        fields.push_back(trimmed(line.substr(0, comma)));
        line.remove_prefix(comma + 1);
    }
    fields.push_back(trimmed(line));
    return fields;
}

}  // namespace morvik::base

#endif

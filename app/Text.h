// Text: integers read from text, and text shown in messages.
#ifndef MORVIK_TEXT_H
#define MORVIK_TEXT_H

#include <charconv>
#include <optional>
#include <string>
#include <string_view>
#include <system_error>

namespace morvik {

/// The integer that the whole text writes in decimal; nothing if there is anything else or it does not fit.
template <class Integer>
std::optional<Integer> parseInteger(std::string_view text)
{
    Integer value{};
    const char* const end = text.data() + text.size();
    const auto result = std::from_chars(text.data(), end, value);
    if (result.ec != std::errc() || result.ptr != end) {
        return std::nullopt;
    }
    return value;
}

/// The text in quotation marks, fit for a one-line message: cut when long, with ? for what does not print.
inline std::string shown(std::string_view text)
{
    constexpr std::size_t longest = 40;
    std::string start(text.substr(0, longest));
    for (char& c : start) {
        if (c < ' ' || c > '~') {
            c = '?';
        }
    }
    return '"' + start + (text.size() > longest ? "...\"" : "\"");
}

}  // namespace morvik

#endif

// Numbers: converts numbers to and from text, whatever the locale.
#ifndef MORVIK_BASE_NUMBERS_H
#define MORVIK_BASE_NUMBERS_H

#include <array>
#include <charconv>
#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <system_error>

namespace morvik::base {

/// Parses the whole text as a number, integers in decimal or in the given base. Nothing if it has any other character
/// or the number is out of range.
template <class Number, class... Base>
std::optional<Number> parseNumber(std::string_view text, Base... base)
{
    Number value{};
    const char* const end = text.data() + text.size();
    const auto result = std::from_chars(text.data(), end, value, base...);
    return result.ec == std::errc() && result.ptr == end ? std::optional<Number>(value) : std::nullopt;
}

/// The number as text; a double in the shortest form that parses to the same value unless another form is given.
template <class Number, class... Form>
std::string numberText(Number value, Form... form)
{
    std::array<char, 400> text = {};  // the largest double has 309 digits before the point
    const auto result = std::to_chars(text.data(), text.data() + text.size(), value, form...);
    return {text.data(), result.ptr};
}

/// Removes the prefix `text` from `rest`; false, with `rest` unchanged, if it begins otherwise.
inline bool take(std::string_view& rest, std::string_view text)
{
    if (rest.substr(0, text.size()) != text) {
        return false;
    }
    rest.remove_prefix(text.size());
    return true;
}

/// Parses a decimal integer at the beginning of the text and removes it, if there is one.
inline std::optional<std::int64_t> takeInteger(std::string_view& rest)
{
    std::int64_t value = 0;
    const auto result = std::from_chars(rest.data(), rest.data() + rest.size(), value);
    if (result.ec != std::errc()) {
        return std::nullopt;
    }
    rest.remove_prefix(static_cast<std::size_t>(result.ptr - rest.data()));
    return value;
}

}  // namespace morvik::base

#endif

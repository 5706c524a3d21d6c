// Numbers: numbers from text and back. Locales have no say in them.
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

/// The number that the whole text writes, of an integer in decimal or to the base that is given; nothing if there is
/// anything else, or the number does not fit.
template <class Number, class... Base>
std::optional<Number> parseNumber(std::string_view text, Base... base)
{
    Number value{};
    const char* const end = text.data() + text.size();
    const auto result = std::from_chars(text.data(), end, value, base...);
    return result.ec == std::errc() && result.ptr == end ? std::optional<Number>(value) : std::nullopt;
}

/// The number as text, the shortest that gives a double again unless a form is asked for.
template <class Number, class... Form>
std::string numberText(Number value, Form... form)
{
    std::array<char, 400> text = {};  // the largest double has 309 digits before the point
    const auto result = std::to_chars(text.data(), text.data() + text.size(), value, form...);
    return {text.data(), result.ptr};
}

/// Takes the text from the beginning of another; false, and nothing taken, when that begins otherwise.
inline bool take(std::string_view& rest, std::string_view text)
{
    if (rest.substr(0, text.size()) != text) {
        return false;
    }
    rest.remove_prefix(text.size());
    return true;
}

/// Takes a decimal integer, if the text begins with one.
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

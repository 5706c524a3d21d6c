// Numbers: decimal integers taken one after the other from a line.
#ifndef MORVIK_HARDWARE_VECTORS_NUMBERS_H
#define MORVIK_HARDWARE_VECTORS_NUMBERS_H

#include <algorithm>
#include <charconv>
#include <cstdint>
#include <optional>
#include <string_view>
#include <system_error>

namespace morvik::vectors {

/// Takes the text from the beginning of another; false, and nothing taken, when that begins otherwise.
inline bool take(std::string_view& rest, std::string_view text)
{
    if (rest.substr(0, text.size()) != text) {
        return false;
    }
    rest.remove_prefix(text.size());
    return true;
}

/// Takes blanks, if the text begins with some.
inline void takeBlanks(std::string_view& rest)
{
    rest.remove_prefix(std::min(rest.find_first_not_of(" \t"), rest.size()));
}

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

}  // namespace morvik::vectors

#endif

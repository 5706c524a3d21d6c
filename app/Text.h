// Text: integers read from text, and text shown in messages.
#ifndef MORVIK_APP_TEXT_H
#define MORVIK_APP_TEXT_H

#include <charconv>
#include <optional>
#include <string_view>
#include <system_error>

#include "simulation/Shown.h"

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

using simulation::shown;

}  // namespace morvik

#endif

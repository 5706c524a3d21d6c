// Thousandths: decimal numbers with three places, as integers, so that no result depends on rounding.
#ifndef MORVIK_BASE_THOUSANDTHS_H
#define MORVIK_BASE_THOUSANDTHS_H

#include <optional>
#include <string>
#include <string_view>

namespace morvik::base {

/// Parses the whole text as a decimal number, times 1000; nothing if it is not one, or has more than three decimals or
/// more than six digits before them.
std::optional<int> parseThousandths(std::string_view text);

/// The shortest decimal: "1.2", "-0.05", "3".
std::string thousandthsText(int thousandths);

/// The number as the nearest double, the same on every machine.
inline double fromThousandths(int thousandths)
{
    return thousandths / 1000.0;
}

}  // namespace morvik::base

#endif

// Thousandths: decimal numbers with three places, as integers, so that no result depends on how a decimal was rounded.
#ifndef MORVIK_BASE_THOUSANDTHS_H
#define MORVIK_BASE_THOUSANDTHS_H

#include <optional>
#include <string>
#include <string_view>

namespace morvik::base {

/// The number that the whole text writes in decimal, times 1000; nothing if it has more than three decimals, or
/// more than six digits before them, or is no such number at all.
std::optional<int> parseThousandths(std::string_view text);

/// The shortest decimal: "1.2", "-0.05", "3".
std::string thousandthsText(int thousandths);

/// The number itself. The quotient is the double nearest to it, the same one on every machine.
inline double fromThousandths(int thousandths)
{
    return thousandths / 1000.0;
}

}  // namespace morvik::base

#endif

// NameMap: what a dump calls its signals and how it writes numbers.
#include "NameMap.h"

#include <algorithm>
#include <cmath>
#include <utility>

#include "base/Numbers.h"

namespace morvik::comparison {

namespace {

/// A real number that is a multiple of an eighth.
std::optional<std::int64_t> eighths(std::string_view text)
{
    const double scaled = 8 * base::parseNumber<double>(text).value_or(NAN);
    if (!(std::abs(scaled) < 1e9) || scaled != std::floor(scaled)) {
        return std::nullopt;
    }
    return static_cast<std::int64_t>(scaled);
}

std::optional<std::int64_t> complement(std::optional<std::int64_t> digits, unsigned bits)
{
    if (!digits || *digits < 0 || *digits >> bits != 0) {
        return std::nullopt;
    }
    const bool isNegative = *digits >> (bits - 1) != 0;
    return isNegative ? *digits - (std::int64_t{1} << bits) : *digits;
}

}  // namespace

std::optional<unsigned> signalCalled(std::string_view name)
{
    const auto* const found =
        std::find_if(passSignals.begin(), passSignals.end(), [&](const Signal& each) { return name == each.name; });
    return found == passSignals.end() ? std::nullopt
                                      : std::optional<unsigned>(static_cast<unsigned>(found - passSignals.begin()));
}

NameMap::NameMap() : bits()
{
    bits.fill(passBits);
    for (unsigned i = 0; i < signalCount; ++i) {
        Element element;
        element.signal = i;
        signals[passSignals[i].name] = {element};
    }
}

std::optional<NameMap::Found> NameMap::find(std::string_view name) const
{
    if (const auto found = signals.find(name); found != signals.end()) {
        return Found{found->first, found->second};
    }
    for (const Pattern& pattern : patterns) {
        if (const auto words = pattern.name.match(name)) {
            Found found = {pattern.name.text(), {}};
            for (const auto& [signal, element] : pattern.elements) {
                const auto known = signalCalled(NamePattern::filled(signal, *words));
                if (!known) {
                    return std::nullopt;
                }
                found.elements.push_back(element);
                found.elements.back().signal = *known;
            }
            return found;
        }
    }
    return std::nullopt;
}

std::optional<std::int64_t> NameMap::number(std::string_view text, unsigned signal) const
{
    const unsigned width = bits[signal];
    const bool isHexadecimal = text.substr(0, 2) == "0x" || text.substr(0, 2) == "0X";
    if (text.size() > 1 && text[0] == '+' && text[1] != '-') {
        text.remove_prefix(1);  // parseNumber() rejects it
    }
    switch (numbers) {
    case NumberForm::integer:
        return base::parseNumber<std::int64_t>(text, 10);
    case NumberForm::unsignedInteger:
        return complement(base::parseNumber<std::int64_t>(text, 10), width);
    case NumberForm::real:
        return eighths(text);
    case NumberForm::hexadecimal:
        return complement(base::parseNumber<std::int64_t>(isHexadecimal ? text.substr(2) : text, 16), width);
    case NumberForm::binary:
        return complement(base::parseNumber<std::int64_t>(text, 2), width);
    default:
        break;
    }
    if (isHexadecimal) {
        return complement(base::parseNumber<std::int64_t>(text.substr(2), 16), width);
    }
    return text.find('.') == std::string_view::npos ? base::parseNumber<std::int64_t>(text, 10) : eighths(text);
}

std::string NameMap::expectedNumber(unsigned signal) const
{
    const std::string width = std::to_string(bits[signal]);
    switch (numbers) {
    case NumberForm::unsignedInteger:
        return "an unsigned integer of " + width + " bits";
    case NumberForm::real:
        return "a multiple of 1/8 from -256 to 255.875";
    case NumberForm::hexadecimal:
        return "a hexadecimal number of " + width + " bits";
    case NumberForm::binary:
        return "a binary number of " + width + " bits";
    case NumberForm::integer:
        return "an integer from -2048 to 2047";
    default:
        return "an integer from -2048 to 2047, or a multiple of 1/8 with a point from -256.0 to 255.875; use a map for "
               "other forms";
    }
}

std::string NameMap::meaningOf(const std::string& name) const
{
    std::vector<unsigned> meant;
    if (const auto found = signals.find(name); found != signals.end()) {
        for (const Element& element : found->second) {
            meant.push_back(element.signal);
        }
        std::sort(meant.begin(), meant.end());
        meant.erase(std::unique(meant.begin(), meant.end()), meant.end());
        return signalNames(meant);
    }
    const auto pattern = std::find_if(
        patterns.begin(), patterns.end(), [&name](const Pattern& each) { return each.name.text() == name; });
    return pattern == patterns.end() ? name : pattern->elements.front().first;
}

}  // namespace morvik::comparison

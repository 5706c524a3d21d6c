// NamePattern: names of a map that stand for many names of a dump.
#ifndef MORVIK_HARDWARE_COMPARISON_NAMEPATTERN_H
#define MORVIK_HARDWARE_COMPARISON_NAMEPATTERN_H

#include <cstddef>
#include <map>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

namespace morvik::comparison {

/// "siso[*].am_{state}": * matches any characters but points, and {WORD} a number.
class NamePattern {
public:
    /// Whether a name of a map is a pattern.
    static bool isPattern(std::string_view name);

    explicit NamePattern(std::string text);

    /// The numbers in the place of words, without leading zeros.
    using Numbers = std::map<std::string, std::string, std::less<>>;

    /// The numbers, if the name matches.
    std::optional<Numbers> match(std::string_view name) const;

    /// The text with numbers in the place of words; words without a number stay.
    static std::string filled(const std::string& text, const Numbers& numbers);

    const std::string& text() const
    {
        return itsText;
    }

    /// How many names between points a matching name has.
    std::size_t parts() const
    {
        return itsParts.size();
    }

private:
    std::string itsText;
    std::vector<std::string> itsParts;
};

}  // namespace morvik::comparison

#endif

// NamePattern: names of a map that stand for many names of a dump.
#include "NamePattern.h"

#include <algorithm>
#include <utility>

namespace morvik::comparison {

namespace {

std::vector<std::string> partsOf(std::string_view name)
{
    std::vector<std::string> parts;
    for (std::size_t point = name.find('.'); point != std::string_view::npos; point = name.find('.')) {
        parts.emplace_back(name.substr(0, point));
        name.remove_prefix(point + 1);
    }
    parts.emplace_back(name);
    return parts;
}

bool isDigit(char character)
{
    return character >= '0' && character <= '9';
}

/// The length of "{WORD}" at the start of a text, or 0.
std::size_t lengthOfWord(std::string_view text)
{
    const std::size_t end = text.empty() || text[0] != '{' ? std::string_view::npos : text.find('}');
    return end == std::string_view::npos || end < 2 ? 0 : end + 1;
}

/// Matches a part of a name. Tries again from the last * alone: as a word takes all digits that follow, earlier ones
/// need not be longer.
class PartMatcher {
public:
    PartMatcher(std::string_view pattern, std::string_view name, NamePattern::Numbers& numbers)
        : itsPattern(pattern), itsName(name), itsNumbers(numbers)
    {
    }

    bool matches()
    {
        while (itsAt < itsPattern.size() || itsIn < itsName.size()) {
            if (itsAt < itsPattern.size() && itsPattern[itsAt] == '*') {
                itsStar = {itsAt++, itsIn, itsNumbers};
            } else if (!advances() && !returns()) {
                return false;
            }
        }
        return true;
    }

private:
    struct Star {
        std::size_t at;
        std::size_t in;
        NamePattern::Numbers numbers;
    };

    bool advances()
    {
        if (itsAt == itsPattern.size() || itsIn == itsName.size()) {
            return false;
        }
        if (const std::size_t length = lengthOfWord(itsPattern.substr(itsAt)); length > 0) {
            return takeNumber(std::string(itsPattern.substr(itsAt + 1, length - 2)), length);
        }
        const bool isSame = itsPattern[itsAt] == itsName[itsIn];
        itsAt += isSame ? 1 : 0;
        itsIn += isSame ? 1 : 0;
        return isSame;
    }

    bool takeNumber(const std::string& word, std::size_t length)
    {
        std::size_t end = itsIn;
        while (end < itsName.size() && isDigit(itsName[end])) {
            ++end;
        }
        std::string number(itsName.substr(itsIn, end - itsIn));
        number.erase(0, std::min(number.find_first_not_of('0'), std::max<std::size_t>(number.size(), 1) - 1));
        if (number.empty() || itsNumbers.try_emplace(word, number).first->second != number) {
            return false;
        }
        itsAt += length;
        itsIn = end;
        return true;
    }

    /// Lets the last * stand for one character more.
    bool returns()
    {
        if (!itsStar || itsStar->in == itsName.size()) {
            return false;
        }
        itsAt = itsStar->at + 1;
        itsIn = ++itsStar->in;
        itsNumbers = itsStar->numbers;
        return true;
    }

    std::string_view itsPattern;
    std::string_view itsName;
    NamePattern::Numbers& itsNumbers;
    std::size_t itsAt = 0;
    std::size_t itsIn = 0;
    std::optional<Star> itsStar;
};

}  // namespace

bool NamePattern::isPattern(std::string_view name)
{
    for (std::size_t brace = name.find('{'); brace != std::string_view::npos; brace = name.find('{', brace + 1)) {
        if (lengthOfWord(name.substr(brace)) > 0) {
            return true;
        }
    }
    return name.find('*') != std::string_view::npos;
}

NamePattern::NamePattern(std::string text) : itsText(std::move(text)), itsParts(partsOf(itsText)) {}

std::optional<NamePattern::Numbers> NamePattern::match(std::string_view name) const
{
    if (static_cast<std::size_t>(std::count(name.begin(), name.end(), '.')) + 1 != itsParts.size()) {
        return std::nullopt;
    }
    const std::vector<std::string> parts = partsOf(name);
    Numbers numbers;
    for (std::size_t i = 0; i < parts.size(); ++i) {
        if (!PartMatcher(itsParts[i], parts[i], numbers).matches()) {
            return std::nullopt;
        }
    }
    return numbers;
}

std::string NamePattern::filled(const std::string& text, const Numbers& numbers)
{
    std::string result;
    for (std::size_t at = 0; at < text.size();) {
        const std::size_t length = lengthOfWord(std::string_view(text).substr(at));
        const auto number = length > 0 ? numbers.find(text.substr(at + 1, length - 2)) : numbers.end();
        result += number != numbers.end() ? number->second : text.substr(at, 1);
        at += number != numbers.end() ? length : 1;
    }
    return result;
}

}  // namespace morvik::comparison

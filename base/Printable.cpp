// Printable: makes text of unknown content safe for a terminal.
#include "Printable.h"

namespace morvik::base {

namespace {

bool isContinuation(char c)
{
    return (static_cast<unsigned char>(c) & 0xc0U) == 0x80U;
}

/// Whether the first character, `length` bytes long, is a C0 or C1 control or DEL.
bool isControl(std::string_view text, std::size_t length)
{
    const bool isC1 = length == 2 && text[0] == '\xc2' && static_cast<unsigned char>(text[1]) < 0xa0U;
    return isC1 || (length == 1 && (static_cast<unsigned char>(text[0]) < ' ' || text[0] == '\x7f'));
}

std::string inHexadecimal(std::string_view bytes)
{
    constexpr char digits[] = "0123456789abcdef";
    std::string text;
    for (const char c : bytes) {
        const auto byte = static_cast<unsigned char>(c);
        text += {'\\', 'x', digits[byte >> 4U], digits[byte & 0xfU]};
    }
    return text;
}

/// Removes the first character, or an invalid byte, from the text. Returns it in visible form.
std::string takeFirst(std::string_view& text, bool keepsLines)
{
    const std::size_t length = lengthOfFirst(text);
    const std::string_view first = text.substr(0, length == 0 ? 1 : length);
    const bool isShown = length > 0 && (!isControl(text, length) || (keepsLines && text[0] == '\n'));
    text.remove_prefix(first.size());
    return isShown ? std::string(first) : inHexadecimal(first);
}

std::string visible(std::string_view text, bool keepsLines)
{
    std::string result;
    while (!text.empty()) {
        result += takeFirst(text, keepsLines);
    }
    return result;
}

}  // namespace

std::size_t lengthOfFirst(std::string_view text)
{
    const auto byteAt = [text](std::size_t i) {
        return static_cast<unsigned char>(text[i]);
    };
    const unsigned first = byteAt(0);
    if (first < 0x80) {
        return 1;
    }
    const std::size_t length = first >= 0xf0 ? 4 : first >= 0xe0 ? 3 : 2;
    if (first < 0xc2 || first > 0xf4 || text.size() < length) {
        return 0;
    }
    for (std::size_t i = 1; i < length; ++i) {
        if (!isContinuation(text[i])) {
            return 0;
        }
    }
    // Overlong forms, surrogates, anything above U+10FFFF, and U+FFFE and U+FFFF, which XML excludes.
    const unsigned second = byteAt(1);
    const bool isNone = (first == 0xe0 && second < 0xa0) || (first == 0xed && second >= 0xa0) ||
                        (first == 0xf0 && second < 0x90) || (first == 0xf4 && second >= 0x90) ||
                        (first == 0xef && second == 0xbf && byteAt(2) >= 0xbe);
    return isNone ? 0 : length;
}

std::string visible(std::string_view text)
{
    return visible(text, false);
}

std::string visibleLines(std::string_view text)
{
    return visible(text, true);
}

std::string shortened(std::string_view text, std::size_t longest)
{
    std::string result;
    while (!text.empty()) {
        const std::string first = takeFirst(text, false);
        if (result.size() + first.size() > longest) {
            return result + "...";
        }
        result += first;
    }
    return result;
}

}  // namespace morvik::base

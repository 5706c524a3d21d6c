// text_fuzz: the text and value utilities take any text and number, and keep what Misc.h promises.
#include <algorithm>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <iterator>
#include <limits>
#include <map>
#include <sstream>
#include <string>
#include <string_view>
#include <vector>

#include "FuzzInput.h"
#include "Misc.h"
#include "TemporaryFiles.h"

namespace {

using Parameters = std::map<std::string, std::string>;

bool isBlank(char c)
{
    const int code = static_cast<unsigned char>(c);
    return code <= 32 || code >= 128;
}

void parseParameters(const std::string& text)
{
    const TemporaryFiles files;
    const std::string file = files.write("parameters", text);
    for (const bool checkNames : {true, false}) {
        Parameters fromStream = {{"a", "1"}, {"b", ""}};
        Parameters fromFile = fromStream;
        std::istringstream stream(text);
        const bool accepted = parse(stream, fromStream, checkNames);
        require(accepted || checkNames, "without checking nothing is refused");
        require(!checkNames || fromStream.size() == 2, "checking names adds none");
        require(parse(file, fromFile, checkNames) == accepted && fromFile == fromStream, "a file reads like a stream");
    }
    Parameters untouched;
    require(!parse(file + "/" + text, untouched, false) && untouched.empty(), "what cannot be opened is refused");
}

void tidy(const std::string& text)
{
    const std::string stripped = stripws(text);
    require(stripws(stripped) == stripped, "stripping twice strips no more");
    require(stripped.size() <= text.size(), "stripping adds nothing");
    const std::string name = toFilename(text);
    require(name.size() <= 2 * text.size(), "a file name grows by no more than percent signs");
    require(std::none_of(name.begin(), name.end(), isBlank), "a file name has no blank");
    require(name.find_first_of("+-.,%=<>") == std::string::npos, "a file name has no special character");
}

void compare(const std::string& a, const std::string& b)
{
    const auto folded = [](std::string text) {
        for (char& c : text) {
            c = c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
        }
        return text;
    };
    require(nocase_compare(a, folded(a)), "a text equals itself in lower case");
    require(nocase_compare(a, b) == (folded(a) == folded(b)), "texts are equal when their lower case is");
    require(nocase_compare(a, b) == nocase_compare(b, a), "a comparison has no order");
}

void split(const std::string& text, const std::string& delimiters, const std::string& whitespace)
{
    std::size_t characters = 0;
    for (const std::string& token : stringtok(text, delimiters, whitespace)) {
        characters += token.size() + 1;
        require(token.find_first_of(delimiters) == std::string::npos, "a token has no delimiter");
        require(token.empty() || whitespace.find(token.front()) == std::string::npos,
                "a token begins with no whitespace");
    }
    require(characters <= text.size() + 1, "tokens and the delimiters between them are parts of the text");

    const std::string set = delimiters.substr(0, delimiters.find('\0'));
    const auto [head, tail] = splitString(text, set.c_str());
    require(head.find_first_of(set) == std::string::npos, "there is no delimiter before the first");
    const bool found = head.size() < text.size();
    require(found ? set.find(text[head.size()]) != std::string::npos && tail == text.substr(head.size() + 1)
                  : head == text && tail.empty(),
            "a split loses the first delimiter alone");
}

void expand(const std::string& text, const std::vector<std::uint32_t>& widths)
{
    std::string expanded = expandTabs(text, widths);
    require(expanded.size() >= text.size() && expanded.find('\t') == std::string::npos, "tabs become spaces");
    std::string plain = text;
    for (std::string* each : {&expanded, &plain}) {
        const auto end = std::remove_if(each->begin(), each->end(), [](char c) { return c == ' ' || c == '\t'; });
        each->erase(end, each->end());
    }
    require(expanded == plain, "everything but spaces and tabs stays");
}

/// What an SI prefix stands for; 1 for none.
long double factorOf(char prefix)
{
    constexpr std::string_view prefixes = "pnumkMGTP";
    constexpr long double factors[] = {1e-12L, 1e-9L, 1e-6L, 1e-3L, 1e3L, 1e6L, 1e9L, 1e12L, 1e15L};
    const std::size_t which = prefixes.find(prefix);
    return which < prefixes.size() ? factors[which] : 1.0L;
}

void writePrefixed(long double value, unsigned precision)
{
    const std::string text = toSIString(value, precision);
    const std::size_t space = text.find(' ');
    require((text.front() == '-') == std::signbit(value), "a minus sign is kept, and no other is written");
    require(space != std::string::npos && space + 2 >= text.size(), "a space and at most one prefix end it");
    if (!std::isfinite(value)) {
        return;
    }
    const std::size_t point = std::min(text.find('.'), space);
    require(space - point == (precision > 0 ? precision + 1 : 0),
            "the digits behind the point are as many as asked for");
    const long double exact = value / factorOf(text.back());
    const long double half = 0.5L * std::pow(10.0L, -static_cast<long double>(precision));
    const long double rounding = std::fabs(exact) * 8 * std::numeric_limits<long double>::epsilon();
    require(std::fabs(std::strtold(text.c_str(), nullptr) - exact) <= half + rounding, "it is the number, rounded");
}

void writeNumbers(FuzzInput& input)
{
    const std::uint64_t bits = std::uint64_t{input.word()} << 32 | input.word();
    const auto low = static_cast<std::uint32_t>(bits);
    const unsigned precision = input.below(8) == 0 ? input.word() % 20000 : input.below(32);
    double number = 0.0;
    std::memcpy(&number, &bits, sizeof number);
    writePrefixed(number, precision);
    writePrefixed(std::ldexp(static_cast<long double>(bits), input.integer() % 16500), precision);
    const auto scaled = [precision](long double value) {
        return toSIString(value, precision);
    };
    require(toSIString(number, precision) == scaled(number), "a double is written as a long double");
    require(toSIString(bits, precision) == scaled(static_cast<long double>(bits)), "64 bits are no signed number");
    require(toSIString(low, precision) == scaled(low), "32 bits are no signed number");

    const auto inRange = std::fabs(number) < 0x1p63 ? static_cast<std::int64_t>(number) : std::int64_t{0};
    require(timeToString(number) == timeToString(static_cast<std::uint32_t>(inRange)),
            "a double counts its low 32 bits, or 0");
    require(timeToString(static_cast<long>(bits)) == timeToString(low), "a long counts its low 32 bits");
}

void writeAndReadTime(std::uint32_t seconds)
{
    const std::string text = timeToString(seconds);
    const std::string unit = text.substr(text.find_last_of("0123456789") + 1);
    require(unit == (seconds < 60       ? "s"
                     : seconds < 3600   ? "min"
                     : seconds < 259200 ? "hr"
                                        : "days"),
            "the unit suits the time");
    // Half a unit of the sixth digit, and what the conversion cuts off.
    const double exact = std::min<double>(seconds, std::numeric_limits<std::int32_t>::max());
    require(std::fabs(stringToTime(text) - exact) <= 5e-6 * exact + 1, "a time is read as it was written");
}

void readTime(const std::string& text)
{
    const std::int32_t seconds = stringToTime(text);
    const std::size_t start = text.find_first_not_of(" \t\n\v\f\r");
    const bool maybeNumber =
        start != std::string::npos && std::string_view("+-.0123456789").find(text[start]) != std::string::npos;
    require(maybeNumber || seconds == 0, "without a number the time is 0");
}

void readWholeTime(FuzzInput& input, const std::string& rest)
{
    constexpr struct {
        char letter;
        std::int64_t seconds;
    } units[] = {{'s', 1}, {'m', 60}, {'M', 60}, {'h', 3600}, {'H', 3600}, {'d', 259200}, {'D', 259200}, {'\0', 1}};
    const auto& unit = units[input.below(std::size(units))];
    const std::int32_t number = input.integer();
    using Limits = std::numeric_limits<std::int32_t>;
    const std::int64_t expected = std::clamp<std::int64_t>(number * unit.seconds, Limits::min(), Limits::max());
    require(stringToTime(" " + std::to_string(number) + " " + unit.letter + rest) == expected,
            "a number and its unit are the time, whatever follows");
}

std::vector<std::uint32_t> takeWidths(FuzzInput& input)
{
    std::vector<std::uint32_t> widths(input.below(5));
    for (std::uint32_t& width : widths) {
        width = input.word() % 2000;  // a text is as long as its widths ask for
    }
    return widths;
}

}  // namespace

int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    const SilencedStreams silenced;
    FuzzInput input(data, size);
    writeNumbers(input);
    writeAndReadTime(input.word());
    const std::vector<std::uint32_t> widths = takeWidths(input);
    const std::string delimiters = input.shortText();
    const std::string whitespace = input.shortText();
    const std::string other = input.shortText();
    readWholeTime(input, other);
    const std::string text = input.text();
    parseParameters(text);
    tidy(text);
    compare(text, other);
    split(text, delimiters, whitespace);
    expand(text, widths);
    readTime(text);
    return 0;
}

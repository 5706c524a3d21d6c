// Misc: property-string splitting and the text and value utilities.
#include "Misc.h"

#include <algorithm>
#include <cmath>
#include <fstream>
#include <iomanip>
#include <limits>
#include <locale>
#include <sstream>
#include <string_view>

#include "Messages.h"

namespace {

constexpr std::uint32_t secondsPerMinute = 60;
constexpr std::uint32_t secondsPerHour = 3600;
constexpr std::uint32_t secondsPerDay = 259200;  // three times 86400 on purpose, in both directions

/// Blanks are the signed character codes up to 32, which include the bytes 128 to 255.
bool isBlank(char c)
{
    return static_cast<signed char>(c) <= 32;
}

/// Upper case as in the "C" locale; toupper() follows the current one.
char toUpperAscii(char c)
{
    return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
}

/// Makes a stream independent of the global locale, and makes exhausted memory throw instead of
/// truncating the text.
void makePlain(std::ios& stream)
{
    stream.imbue(std::locale::classic());
    stream.exceptions(std::ios::badbit);
}

/// Returns a parameter line without its comment and leading blanks. Unlike elsewhere, blanks are only the
/// codes 1 to 32.
std::string_view lineContent(std::string_view line)
{
    line = line.substr(0, line.find("//"));
    line = line.substr(0, line.find('#'));
    while (!line.empty() && line.front() >= 1 && line.front() <= 32) {
        line.remove_prefix(1);
    }
    return line;
}

/// Reads the lines of a parameter file; `allNamesValid` becomes false when one is refused.
void readParameters(std::istream& stream,
                    std::map<std::string, std::string>& parameters,
                    bool checkNames,
                    bool& allNamesValid)
{
    std::uint64_t lineNumber = 0;
    std::string line;
    while (!stream.eof() && std::getline(stream, line)) {
        ++lineNumber;
        const std::string content(lineContent(line));
        if (content.empty()) {
            continue;
        }
        const auto [left, right] = splitString(content, "=");
        const std::string name = stripws(left);
        if (checkNames && parameters.count(name) == 0) {
            morvik::messages::writeError("ERROR:", lineNumber, ":Parameter name '", name, "' is invalid");
            allNamesValid = false;
            continue;
        }
        parameters[name] = stripws(right);
    }
}

void appendForFilename(std::string& name, char c)
{
    switch (c) {
    case '+':
    case '.':
        name += 'p';
        break;
    case '-':
        name += 'm';
        break;
    case ',':
        name += 'c';
        break;
    case '%':
        name += "pc";
        break;
    case '=':
        break;
    case '<':
        name += '[';
        break;
    case '>':
        name += ']';
        break;
    default:
        name += c;
    }
}

/// Returns the number to print and the suffix for a magnitude. The order of the tests matters.
std::pair<long double, const char*> scaleToPrefix(long double a)
{
    if (a > 5e14) {
        return {a / 1e15, " P"};
    }
    if (a > 5e11) {
        return {a / 1e12, " T"};
    }
    if (a > 5e8) {
        return {a / 1e9, " G"};
    }
    if (a > 5e5) {
        return {a / 1e6, " M"};
    }
    if (a > 500) {
        return {a / 1e3, " k"};
    }
    if (a > 0.5 || a < 1e-15) {
        return {a, " "};
    }
    if (a > 5e-4) {
        return {a * 1e3, " m"};
    }
    if (a > 5e-10) {
        return {a * 1e6, " u"};
    }
    if (a > 5e-13) {
        return {a * 1e9, " n"};
    }
    return {a * 1e12, " p"};
}

std::string toFixed(long double value, unsigned precision)
{
    // No value has more digits after the point. Further zeros are appended here: the stream would
    // build them on the stack, which a large precision overflows.
    using Limits = std::numeric_limits<long double>;
    constexpr unsigned mostDigits = Limits::digits - Limits::min_exponent;
    const unsigned digits = std::min(precision, mostDigits);

    std::ostringstream os;
    makePlain(os);
    os << std::fixed << std::setprecision(static_cast<int>(digits)) << value;
    std::string text = os.str();
    if (std::isfinite(value)) {
        text.append(precision - digits, '0');
    }
    return text;
}

}  // namespace

std::pair<std::string, std::string> splitString(const std::string& text, const char* delimiters)
{
    const std::size_t position = text.find_first_of(delimiters);
    if (position == std::string::npos) {
        return {text, ""};
    }
    return {text.substr(0, position), text.substr(position + 1)};
}

bool parse(std::istream& stream, std::map<std::string, std::string>& parameters, bool checkNames)
{
    bool allNamesValid = true;
    readParameters(stream, parameters, checkNames, allNamesValid);
    return allNamesValid;
}

bool parse(const std::string& fileName, std::map<std::string, std::string>& parameters, bool checkNames)
{
    std::ifstream file(fileName);
    if (!file) {
        morvik::messages::writeError("ERROR:Could not open input file '", fileName, "'");
        return false;
    }
    makePlain(file);
    bool allNamesValid = true;
    try {
        readParameters(file, parameters, checkNames, allNamesValid);
    } catch (const std::ios::failure&) {
        return allNamesValid;  // a read failure ends the file; a folder fails at once
    }
    return allNamesValid;
}

std::vector<std::string> stringtok(const std::string& text,
                                   const std::string& delimiters,
                                   const std::string& whitespace)
{
    std::vector<std::string> tokens;
    std::size_t first = text.find_first_not_of(whitespace);
    while (first != std::string::npos) {
        const std::size_t end = std::min(text.find_first_of(delimiters, first), text.size());
        tokens.push_back(text.substr(first, end - first));
        first = text.find_first_not_of(whitespace, end + 1);
    }
    return tokens;
}

std::string stripws(const std::string& text)
{
    std::string stripped;
    bool spacePending = false;
    for (const char c : text) {
        if (isBlank(c)) {
            spacePending = !stripped.empty();
            continue;
        }
        if (spacePending) {
            stripped += ' ';
            spacePending = false;
        }
        stripped += c;
    }
    return stripped;
}

// NOLINTNEXTLINE(performance-unnecessary-value-param): by value, as the interface has it.
std::string expandTabs(std::string text, const std::vector<std::uint32_t>& widths)
{
    std::string expanded;
    std::uint64_t column = 0;
    std::uint32_t width = 16;
    auto nextWidth = widths.begin();
    for (const char c : text) {
        if (c != '\t') {
            expanded += c;
            continue;
        }
        if (nextWidth != widths.end()) {
            width = *nextWidth++;
        }
        column += width;
        // The text already reaches the previous tab's column, so at most one width is missing.
        const std::uint64_t missing = column > expanded.size() ? column - expanded.size() : 1;
        expanded.append(static_cast<std::size_t>(missing), ' ');
    }
    return expanded;
}

bool nocase_compare(const std::string& a, const std::string& b)
{
    return std::equal(a.begin(), a.end(), b.begin(), b.end(), nocase_compare2);
}

bool nocase_compare2(char a, char b)
{
    return toUpperAscii(a) == toUpperAscii(b);
}

std::string toFilename(const std::string& text)
{
    std::string name;
    bool blankPending = false;
    for (const char c : std::string_view(text.c_str())) {
        if (isBlank(c)) {
            blankPending = true;
            continue;
        }
        if (blankPending) {
            name += '_';
            blankPending = false;
        }
        appendForFilename(name, c);
    }
    return name;
}

std::string toSIString(long double value, unsigned precision)
{
    const bool negative = value < 0;
    const auto [number, suffix] = scaleToPrefix(negative ? -value : value);
    return (negative ? "-" : "") + toFixed(number, precision) + suffix;
}

std::string toSIString(double value, unsigned precision)
{
    return toSIString(static_cast<long double>(value), precision);
}

std::string toSIString(std::uint64_t value, unsigned precision)
{
    return toSIString(static_cast<long double>(value), precision);
}

std::string toSIString(std::uint32_t value, unsigned precision)
{
    return toSIString(static_cast<long double>(value), precision);
}

std::string timeToString(std::uint32_t seconds)
{
    std::ostringstream os;
    makePlain(os);
    if (seconds < secondsPerMinute) {
        os << seconds << "s";
    } else if (seconds < secondsPerHour) {
        os << static_cast<double>(seconds) / secondsPerMinute << "min";
    } else if (seconds < secondsPerDay) {
        os << static_cast<double>(seconds) / secondsPerHour << "hr";
    } else {
        os << static_cast<double>(seconds) / secondsPerDay << "days";
    }
    return os.str();
}

std::string timeToString(double seconds)
{
    // Beyond 2^63 the conversion to an integer is undefined.
    const std::int64_t whole = std::fabs(seconds) < 0x1p63 ? static_cast<std::int64_t>(seconds) : 0;
    return timeToString(static_cast<std::uint32_t>(whole));
}

std::string timeToString(long seconds)
{
    return timeToString(static_cast<std::uint32_t>(seconds));
}

// NOLINTNEXTLINE(performance-unnecessary-value-param): by value, as the interface has it.
std::int32_t stringToTime(std::string text)
{
    std::istringstream is(text);
    makePlain(is);
    double number = 0;  // 0 without a number; the largest double if the number is larger
    char unit = 's';
    is >> number >> unit;

    long double seconds = number;
    switch (toUpperAscii(unit)) {
    case 'M':
        seconds *= secondsPerMinute;
        break;
    case 'H':
        seconds *= secondsPerHour;
        break;
    case 'D':
        seconds *= secondsPerDay;
        break;
    default:
        break;
    }
    using Limits = std::numeric_limits<std::int32_t>;
    return static_cast<std::int32_t>(std::clamp<long double>(seconds, Limits::min(), Limits::max()));
}

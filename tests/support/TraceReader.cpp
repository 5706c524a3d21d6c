// TraceReader: reads the values of the model's trace.
#include "TraceReader.h"

#include <algorithm>
#include <charconv>
#include <system_error>
#include <utility>

#include "base/Error.h"
#include "base/Shown.h"

namespace morvik::support {

namespace {

bool startsWith(std::string_view text, std::string_view start)
{
    return text.substr(0, start.size()) == start;
}

/// Removes the field up to the next blank, and the blanks after it, from the text; returns the field.
std::string_view takeField(std::string_view& text)
{
    const std::string_view field = text.substr(0, text.find(' '));
    text.remove_prefix(field.size());
    text.remove_prefix(std::min(text.find_first_not_of(' '), text.size()));
    return field;
}

template <class Integer>
std::optional<Integer> integer(std::string_view digits)
{
    Integer value{};
    const char* const end = digits.data() + digits.size();
    const auto result = std::from_chars(digits.data(), end, value);
    return result.ec == std::errc() && result.ptr == end ? std::optional<Integer>(value) : std::nullopt;
}

/// Parses a field such as "-12.375000", a sign and a multiple of an eighth with six decimals, to steps.
std::optional<std::int16_t> traceValue(std::string_view field)
{
    constexpr std::uint32_t millionthsInStep = 1000000 / traceStepsInOne;
    constexpr std::size_t decimals = 6;
    if (field.size() < decimals + 3 || (field[0] != '+' && field[0] != '-')) {
        return std::nullopt;
    }
    const std::size_t point = field.size() - decimals - 1;
    const auto whole = integer<std::uint16_t>(field.substr(1, point - 1));
    const auto fraction = integer<std::uint32_t>(field.substr(point + 1));
    if (field[point] != '.' || !whole || !fraction || *fraction % millionthsInStep != 0) {
        return std::nullopt;
    }
    const int magnitude = *whole * traceStepsInOne + static_cast<int>(*fraction / millionthsInStep);
    const int value = field[0] == '-' ? -magnitude : magnitude;
    if (value < -2048 || value > 2047) {
        return std::nullopt;
    }
    return static_cast<std::int16_t>(value);
}

/// Whether a line is one between passes and their rows, without values.
bool isBetween(std::string_view line)
{
    constexpr std::array<std::string_view, 6> starts = {
        "---", "itsSys ", "itsPar0[", "itsPar1[", "n    int ", "WARNING:"};
    return std::any_of(
        starts.begin(), starts.end(), [line](std::string_view start) { return startsWith(line, start); });
}

}  // namespace

TraceReader::TraceReader(std::istream& input, std::string name) : itsInput(input), itsName(std::move(name)) {}

bool TraceReader::next(TraceStep& step)
{
    while (std::getline(itsInput, itsLine)) {
        ++itsNumber;
        if (startsWith(itsLine, "decode=")) {
            beginPass();
        } else if (!isBetween(itsLine)) {
            if (!itsPass) {
                fail("no line of a trace");
            }
            step = *itsPass;
            readRow(step);
            ++itsPass->step;
            return true;
        }
    }
    if (itsInput.bad()) {
        throw base::fileError(itsName, "read");
    }
    return false;
}

void TraceReader::fail(const std::string& what) const
{
    throw base::Error(itsName + ':' + std::to_string(itsNumber) + ": " + what);
}

void TraceReader::beginPass()
{
    std::string_view rest = itsLine;
    rest.remove_prefix(std::string_view("decode=").size());
    const auto decode = integer<std::uint64_t>(takeField(rest));
    const std::string_view siso = "siso=";
    const auto halfIteration = startsWith(rest, siso) ? integer<std::uint32_t>(rest.substr(siso.size())) : std::nullopt;
    if (!decode || !halfIteration) {
        fail("no beginning of a pass, expected \"decode=N siso=N\"");
    }
    itsPass = TraceStep{*decode, *halfIteration, 0, {}};
}

void TraceReader::readRow(TraceStep& step) const
{
    std::string_view rest = itsLine;
    const std::string_view number = takeField(rest);
    if (integer<std::uint32_t>(number) != step.step) {
        fail("trellis step " + base::shown(number) + ", expected " + std::to_string(step.step));
    }
    for (std::size_t i = 0; i < traceSignals.size(); ++i) {
        const std::string_view field = takeField(rest);
        const auto value = traceValue(field);
        if (!value) {
            fail(std::string(traceSignals[i]) + ' ' + base::shown(field) +
                 " is no traced value, expected a sign and six decimals, a multiple of 1/8 from -256 to 255.875");
        }
        step.values[i] = *value;
    }
    if (!rest.empty()) {
        fail("more than " + std::to_string(traceSignals.size()) + " values");
    }
}

}  // namespace morvik::support

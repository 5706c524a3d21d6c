// Json: parses untrusted JSON; helpers for JSON in messages and files.
#include "Json.h"

#include <algorithm>
#include <iterator>
#include <set>
#include <utility>
#include <vector>

#include "Error.h"
#include "Shown.h"

namespace morvik::base {

namespace {

/// Iterates over a text and records how far the parser has read.
class Cursor {
public:
    using iterator_category = std::input_iterator_tag;
    using value_type = char;
    using difference_type = std::ptrdiff_t;
    using pointer = const char*;
    using reference = const char&;

    Cursor(const char* place, const char*& noted) : itsPlace(place), itsNoted(&noted) {}

    reference operator*() const
    {
        return *itsPlace;
    }

    Cursor& operator++()
    {
        *itsNoted = ++itsPlace;
        return *this;
    }

    Cursor operator++(int)
    {
        const Cursor before = *this;
        ++*this;
        return before;
    }

    bool operator==(const Cursor& other) const
    {
        return itsPlace == other.itsPlace;
    }

    bool operator!=(const Cursor& other) const
    {
        return itsPlace != other.itsPlace;
    }

private:
    const char* itsPlace;
    const char** itsNoted;
};

class Parser {
public:
    Parser(const std::string& text, const std::string& fileName, const JsonLimits& limits)
        : itsText(text), itsName(fileName), itsLimits(limits)
    {
    }

    Json parse()
    {
        if (itsText.size() > itsLimits.bytes) {
            throw Error(itsName + ": has more than " + std::to_string(itsLimits.bytes) + " bytes of JSON");
        }
        const char* const end = itsText.data() + itsText.size();
        const auto watch = [this](int, Json::parse_event_t event, const Json& parsed) {
            take(event, parsed);
            return true;
        };
        try {
            return Json::parse(Cursor(itsText.data(), itsSeen), Cursor(end, itsSeen), watch);
        } catch (const Json::parse_error& error) {
            // The parser counts bytes from 1; the end of the text is one past the last.
            const std::size_t place = std::max(error.byte, std::size_t{1}) - 1;
            fail(place, "no JSON, character " + std::to_string(character(place)) + " is not expected there");
        } catch (const Json::exception&) {
            fail(behind(),
                 "no JSON, the number before character " + std::to_string(character(behind())) + " is too large");
        }
    }

private:
    void take(Json::parse_event_t event, const Json& parsed)
    {
        using Event = Json::parse_event_t;
        if (event == Event::object_end || event == Event::array_end) {
            itsOpen.pop_back();
            return;
        }
        if (++itsValues > itsLimits.values) {
            fail(behind(), "more than " + std::to_string(itsLimits.values) + " values of JSON");
        }
        if (event == Event::object_start || event == Event::array_start) {
            open();
        } else if (event == Event::key && !itsOpen.back().insert(parsed.get<std::string>()).second) {
            fail(behind(), shownValue(parsed) + " appears twice");
        }
    }

    void open()
    {
        if (itsOpen.size() == itsLimits.levels) {
            fail(behind(),
                 "character " + std::to_string(character(behind())) + " opens more than " +
                     std::to_string(itsLimits.levels) + " levels of lists and objects");
        }
        itsOpen.emplace_back();
    }

    /// The offset of the last character read.
    std::size_t behind() const
    {
        const auto read = static_cast<std::size_t>(itsSeen - itsText.data());
        return std::max(read, std::size_t{1}) - 1;
    }

    /// The column of a character, from 1.
    std::size_t character(std::size_t place) const
    {
        const std::size_t before = place == 0 ? std::string::npos : itsText.rfind('\n', place - 1);
        return before == std::string::npos ? place + 1 : place - before;
    }

    [[noreturn]] void fail(std::size_t place, const std::string& what) const
    {
        const auto line = std::count(itsText.begin(), itsText.begin() + static_cast<std::ptrdiff_t>(place), '\n') + 1;
        throw Error(itsName + ':' + std::to_string(line) + ": " + what);
    }

    const std::string& itsText;
    const std::string& itsName;
    const JsonLimits& itsLimits;
    const char* itsSeen = itsText.data();
    std::size_t itsValues = 0;
    std::vector<std::set<std::string>> itsOpen;  // names so far in each open object and list
};

}  // namespace

Json parseJson(const std::string& text, const std::string& fileName, const JsonLimits& limits)
{
    return Parser(text, fileName, limits).parse();
}

std::string shownValue(const Json& value)
{
    if (value.is_string()) {
        return shown(value.get_ref<const std::string&>());
    }
    return value.is_object() ? "an object" : value.is_array() ? "a list" : value.dump();
}

std::string asUtf8(const std::string& text)
{
    return Json::parse(jsonString(text)).get<std::string>();
}

std::string jsonString(const std::string& text)
{
    return Json(text).dump(-1, ' ', false, Json::error_handler_t::replace);
}

JsonMembers::JsonMembers(const Json& value, std::string place) : itsObject(value), itsPlace(std::move(place))
{
    if (!value.is_object()) {
        throw Error(itsPlace + ": is " + shownValue(value) + ", expected an object");
    }
}

bool JsonMembers::has(const std::string& name) const
{
    return itsObject.contains(name);
}

const Json& JsonMembers::at(const std::string& name) const
{
    const auto found = itsObject.find(name);
    if (found == itsObject.end()) {
        throw Error(itsPlace + ": lacks " + shown(name));
    }
    return *found;
}

std::string JsonMembers::text(const std::string& name) const
{
    if (!at(name).is_string()) {
        refuse(name, "expected a string");
    }
    return at(name).get<std::string>();
}

bool JsonMembers::flag(const std::string& name) const
{
    if (!at(name).is_boolean()) {
        refuse(name, "expected true or false");
    }
    return at(name).get<bool>();
}

double JsonMembers::number(const std::string& name) const
{
    if (!at(name).is_number()) {
        refuse(name, "expected a number");
    }
    return at(name).get<double>();
}

const Json& JsonMembers::list(const std::string& name) const
{
    if (!at(name).is_array()) {
        refuse(name, "expected a list");
    }
    return at(name);
}

std::uint64_t JsonMembers::integer(const std::string& name, std::uint64_t lowest, std::uint64_t highest) const
{
    const Json& value = at(name);
    if (!value.is_number_unsigned() || value.get<std::uint64_t>() < lowest || value.get<std::uint64_t>() > highest) {
        refuse(name, "expected an integer from " + std::to_string(lowest) + " to " + std::to_string(highest));
    }
    return value.get<std::uint64_t>();
}

void JsonMembers::refuse(const std::string& name, const std::string& expectation) const
{
    throw Error(itsPlace + ": " + shown(name) + " is " + shownValue(at(name)) + ", " + expectation);
}

}  // namespace morvik::base

// Json: parses untrusted JSON; helpers for JSON in messages and files.
#ifndef MORVIK_BASE_JSON_H
#define MORVIK_BASE_JSON_H

#include <cstddef>
#include <cstdint>
#include <nlohmann/json.hpp>
#include <string>

namespace morvik::base {

using Json = nlohmann::json;

/// Limits of a text: far above any file that is written here, too low to exhaust a machine.
struct JsonLimits {
    std::size_t bytes = std::size_t{1} << 28;
    std::size_t values = std::size_t{1} << 25;
    std::size_t levels = 32;  // of nested lists and objects
};

/// Parses a text. Refuses one beyond the limits or with duplicate names in an object. Throws Error "FILE:LINE: ...".
Json parseJson(const std::string& text, const std::string& fileName, const JsonLimits& limits = {});

/// A value for messages: short, on one line.
std::string shownValue(const Json& value);

/// The text with U+FFFD for each invalid byte of UTF-8, which JSON cannot hold.
std::string asUtf8(const std::string& text);

/// The text as a JSON string, quotation marks included.
std::string jsonString(const std::string& text);

/// Typed access to the members of an object. Throws Error "PLACE: ..." if they are missing or wrong.
class JsonMembers {
public:
    /// Throws unless the value is an object. The value must outlive the members.
    JsonMembers(const Json& value, std::string place);

    /// What messages about the object begin with.
    const std::string& place() const
    {
        return itsPlace;
    }

    bool has(const std::string& name) const;

    const Json& at(const std::string& name) const;
    std::string text(const std::string& name) const;
    bool flag(const std::string& name) const;
    double number(const std::string& name) const;
    const Json& list(const std::string& name) const;

    /// An integer from `lowest` to `highest`.
    std::uint64_t integer(const std::string& name, std::uint64_t lowest, std::uint64_t highest) const;

    /// Throws: the member is not what was expected.
    [[noreturn]] void refuse(const std::string& name, const std::string& expectation) const;

private:
    const Json& itsObject;
    std::string itsPlace;
};

}  // namespace morvik::base

#endif

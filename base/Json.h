// Json: the one reader of JSON, which takes no text on trust, and what messages and files need beside it.
#ifndef MORVIK_BASE_JSON_H
#define MORVIK_BASE_JSON_H

#include <cstddef>
#include <cstdint>
#include <nlohmann/json.hpp>
#include <string>

namespace morvik::base {

using Json = nlohmann::json;

/// What a text may have at most: far more than any file that is written here, and too little to exhaust a machine.
struct JsonLimits {
    std::size_t bytes = std::size_t{1} << 28;
    std::size_t values = std::size_t{1} << 25;
    std::size_t levels = 32;  // of lists and objects within each other
};

/// Reads a text whose limits are kept and whose objects name no member twice. Throws Error "FILE:LINE: ...".
Json parseJson(const std::string& text, const std::string& fileName, const JsonLimits& limits = {});

/// A value as messages show it: short, on one line.
std::string shownValue(const Json& value);

/// The text with U+FFFD for bytes that are no UTF-8, which JSON cannot hold.
std::string asUtf8(const std::string& text);

/// The text as a string of JSON, quotation marks included.
std::string jsonString(const std::string& text);

/// The members of an object. Whatever is wrong with them is thrown as Error: "PLACE: ...".
class JsonMembers {
public:
    /// Throws unless the value is an object. The value outlives the members.
    JsonMembers(const Json& value, std::string place);

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

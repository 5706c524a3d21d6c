// Lists: comma-separated option values.
#ifndef MORVIK_APP_LISTS_H
#define MORVIK_APP_LISTS_H

#include <CLI/CLI.hpp>
#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

#include "base/Shown.h"

namespace morvik {

/// Splits a text at the separators into at least one part.
inline std::vector<std::string> splitAt(char separator, std::string_view text)
{
    std::vector<std::string> parts;
    for (std::size_t end = text.find(separator); end != std::string_view::npos; end = text.find(separator)) {
        parts.emplace_back(text.substr(0, end));
        text.remove_prefix(end + 1);
    }
    parts.emplace_back(text);
    return parts;
}

/// The texts of the values, with commas between them.
template <class Values, class Text>
std::string listed(const Values& values, Text textOf)
{
    std::string list;
    for (const auto& value : values) {
        list += (list.empty() ? "" : ",") + textOf(value);
    }
    return list;
}

/// Adds an option that takes a comma-separated list. `append` parses one element and appends its values, or throws
/// CLI::ValidationError, as does a duplicate value. The values end up in ascending order.
template <class Value, class Append>
CLI::Option* addListOption(CLI::App& command,
                           const std::string& name,
                           std::vector<Value>& values,
                           Append append,
                           const std::string& description)
{
    const auto take = [name, &values, append](const std::string& text) {
        values.clear();
        for (const std::string& part : splitAt(',', text)) {
            append(part, values);
            std::sort(values.begin(), values.end());
            if (std::adjacent_find(values.begin(), values.end()) != values.end()) {
                throw CLI::ValidationError(name, base::shown(part) + " is not allowed, it has been given before");
            }
        }
    };
    return command.add_option_function<std::string>(name, take, description);
}

}  // namespace morvik

#endif

// Shown: text of unknown content in messages.
#ifndef MORVIK_BASE_SHOWN_H
#define MORVIK_BASE_SHOWN_H

#include <string>
#include <string_view>

namespace base {

/// The text fit for a one-line message: cut behind so many characters, with ? for what does not print.
inline std::string shortened(std::string_view text, std::size_t longest)
{
    std::string start(text.substr(0, longest));
    for (char& c : start) {
        if (c < ' ' || c > '~') {
            c = '?';
        }
    }
    return start + (text.size() > longest ? "..." : "");
}

/// A name or value from a file, in quotation marks.
inline std::string shown(std::string_view text)
{
    constexpr std::size_t longest = 40;
    return '"' + shortened(text, longest) + '"';
}

}  // namespace base

#endif

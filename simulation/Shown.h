// Shown: text of unknown content in messages.
#ifndef MORVIK_SIMULATION_SHOWN_H
#define MORVIK_SIMULATION_SHOWN_H

#include <string>
#include <string_view>

namespace simulation {

/// The text in quotation marks, fit for a one-line message: cut when long, with ? for what does not print.
inline std::string shown(std::string_view text)
{
    constexpr std::size_t longest = 40;
    std::string start(text.substr(0, longest));
    for (char& c : start) {
        if (c < ' ' || c > '~') {
            c = '?';
        }
    }
    return '"' + start + (text.size() > longest ? "...\"" : "\"");
}

}  // namespace simulation

#endif

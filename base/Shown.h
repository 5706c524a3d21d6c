// Shown: quotes text of unknown content in messages.
#ifndef MORVIK_BASE_SHOWN_H
#define MORVIK_BASE_SHOWN_H

#include <string>
#include <string_view>

#include "Printable.h"

namespace morvik::base {

/// A name or value from a file, in quotation marks.
inline std::string shown(std::string_view text)
{
    constexpr std::size_t longest = 40;
    return '"' + shortened(text, longest) + '"';
}

}  // namespace morvik::base

#endif

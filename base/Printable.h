// Printable: makes text of unknown content safe for a terminal.
#ifndef MORVIK_BASE_PRINTABLE_H
#define MORVIK_BASE_PRINTABLE_H

#include <cstddef>
#include <string>
#include <string_view>

namespace morvik::base {

/// The length in bytes of the first UTF-8 character of a non-empty text; 0 if it is invalid.
std::size_t lengthOfFirst(std::string_view text);

/// The text with each byte of a control character or of invalid UTF-8 escaped as \x1b: control characters may move the
/// cursor, rename the window, or hide what was printed before.
std::string visible(std::string_view text);

/// The same for text of several lines, keeping line ends.
std::string visibleLines(std::string_view text);

/// The visible text; if longer than `longest` bytes, its start and "...". Never splits a character or an escape.
std::string shortened(std::string_view text, std::size_t longest);

}  // namespace morvik::base

#endif

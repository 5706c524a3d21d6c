// Printable: texts of unknown content, as a terminal may get them.
#ifndef MORVIK_BASE_PRINTABLE_H
#define MORVIK_BASE_PRINTABLE_H

#include <cstddef>
#include <string>
#include <string_view>

namespace morvik::base {

/// The length of the character of UTF-8 that the text, which is not empty, begins with; 0 where there is none.
std::size_t lengthOfFirst(std::string_view text);

/// The text with each byte that is part of a control character, or of none, written as \x1b: such characters may move
/// the cursor, rename the window, or hide what was printed before.
std::string visible(std::string_view text);

/// The same of a text of several lines, whose ends stay.
std::string visibleLines(std::string_view text);

/// The visible text, of one that has more than so many bytes the start. No character and no \x1b is cut in two.
std::string shortened(std::string_view text, std::size_t longest);

}  // namespace morvik::base

#endif

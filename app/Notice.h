// Notice: what a command tells beside its results.
#ifndef MORVIK_APP_NOTICE_H
#define MORVIK_APP_NOTICE_H

#include <string>

namespace morvik {

/// Writes one line on the standard error stream. What names and values bring along cannot work on the terminal.
void notice(const std::string& line);

/// Writes text on standard output, of which that is true as well, but for the ends of its lines. Throws base::Error
/// when it cannot be written.
void print(const std::string& text);

}  // namespace morvik

#endif

// Notice: prints text with control characters made visible.
#ifndef MORVIK_APP_NOTICE_H
#define MORVIK_APP_NOTICE_H

#include <string>

namespace morvik {

/// Writes one line to standard error. Control characters in names and values are escaped.
void notice(const std::string& line);

/// Writes text to standard output, escaped likewise except for line ends. Throws base::Error if it cannot be written.
void print(const std::string& text);

}  // namespace morvik

#endif

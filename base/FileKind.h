// FileKind: files that are given for a text and are none, known by their first bytes.
#ifndef MORVIK_BASE_FILEKIND_H
#define MORVIK_BASE_FILEKIND_H

#include <string_view>

namespace morvik::base {

/// What stands behind "FILE: " in the message about a file that begins so: that it is compressed, or a waveform in
/// another format than VCD, or not in UTF-8, and how to make a text of it. Null when it may be a text. The first line,
/// with or without its end, is enough.
const char* whyNoText(std::string_view beginning);

}  // namespace morvik::base

#endif

// FileKind: recognises files that are not text by their first bytes.
#ifndef MORVIK_BASE_FILEKIND_H
#define MORVIK_BASE_FILEKIND_H

#include <string_view>

namespace morvik::base {

/// Returns what to report after "FILE: " if such a beginning is not UTF-8 text: that the file is compressed, a waveform
/// other than VCD, or in another encoding, and how to convert it. Null if it may be text. The first line, with or
/// without its end, is enough.
const char* whyNoText(std::string_view beginning);

/// What other programs turn into text.
enum class Packing { none, gzip, fst };

/// The packing of a file with such a beginning.
Packing packingOf(std::string_view beginning);

}  // namespace morvik::base

#endif

// TextFile: reads whole files.
#ifndef MORVIK_BASE_TEXTFILE_H
#define MORVIK_BASE_TEXTFILE_H

#include <cstddef>
#include <istream>
#include <string>

namespace morvik::base {

/// The most bytes that are read: more than any results file has.
constexpr std::size_t largestText = std::size_t{1} << 28;

/// The content of a text file, without a byte order mark. Throws Error, also if it is not text or too large.
std::string readText(const std::string& fileName);

/// Throws Error if the name, or what it links to, is something other than a regular file: a device or a pipe may have
/// no end.
void expectRegularFile(const std::string& fileName);

/// Like readText(fileName), for an open file that messages call `name`, of at most `largest` bytes.
std::string readText(std::istream& file, const std::string& name, std::size_t largest);

}  // namespace morvik::base

#endif

// TextFile: reads a file as a whole.
#ifndef MORVIK_BASE_TEXTFILE_H
#define MORVIK_BASE_TEXTFILE_H

#include <cstddef>
#include <istream>
#include <string>

namespace morvik::base {

/// As much as can be read: more than any file of results has.
constexpr std::size_t largestText = std::size_t{1} << 28;

/// The content of a file of text, without a byte order mark. Throws Error, also when it is no text or too large.
std::string readText(const std::string& fileName);

/// Throws Error if there is something else than a regular file, to which a link may lead: a device or a pipe may have
/// no end.
void expectRegularFile(const std::string& fileName);

/// What readText(fileName) gives of an open file, which messages call `name`, of at most so many bytes.
std::string readText(std::istream& file, const std::string& name, std::size_t largest);

}  // namespace morvik::base

#endif

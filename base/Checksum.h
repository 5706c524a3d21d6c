// Checksum: the SHA-256 of a file.
#ifndef MORVIK_BASE_CHECKSUM_H
#define MORVIK_BASE_CHECKSUM_H

#include <string>

namespace morvik::base {

/// Returns 64 hexadecimal digits (FIPS 180-4). Throws base::Error, also if it is no regular file.
std::string sha256(const std::string& fileName);

}  // namespace morvik::base

#endif

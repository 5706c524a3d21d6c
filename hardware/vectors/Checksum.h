// Checksum: the SHA-256 of a file.
#ifndef MORVIK_HARDWARE_VECTORS_CHECKSUM_H
#define MORVIK_HARDWARE_VECTORS_CHECKSUM_H

#include <string>

namespace morvik::vectors {

/// 64 hexadecimal digits, as sha256sum of the GNU core utilities finds them. Throws base::Error,
/// also when it is no regular file.
std::string sha256(const std::string& fileName);

}  // namespace morvik::vectors

#endif

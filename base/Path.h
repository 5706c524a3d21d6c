// Path: file names as paths.
#ifndef MORVIK_BASE_PATH_H
#define MORVIK_BASE_PATH_H

#include <filesystem>
#include <string>

namespace morvik::base {

/// The path of a file name. Names are UTF-8 on every system; a path made of a string directly would take it for the
/// characters of a Windows code page.
inline std::filesystem::path pathOf(const std::string& name)
{
    return std::filesystem::u8path(name);
}

}  // namespace morvik::base

#endif

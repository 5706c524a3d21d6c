// SystemWindows: what the files that implement System.h for Windows share.
#ifndef MORVIK_BASE_SYSTEMWINDOWS_H
#define MORVIK_BASE_SYSTEMWINDOWS_H

#define WIN32_LEAN_AND_MEAN
#define NOMINMAX
#include <windows.h>
// after it
#include <io.h>

#include <cstdint>
#include <string>

#include "Path.h"

namespace morvik::base::system {

/// The handle of an open file; INVALID_HANDLE_VALUE if there is none.
inline HANDLE handleOf(int descriptor)
{
    return descriptor < 0 ? INVALID_HANDLE_VALUE : reinterpret_cast<HANDLE>(_get_osfhandle(descriptor));
}

inline std::wstring wide(const std::string& name)
{
    return pathOf(name).wstring();
}

/// Sets errno to what GetLastError() says.
void setErrno();

}  // namespace morvik::base::system

#endif

// The library's version, as project() of CMakeLists.txt states it.
#include "morvik_v1_0_version.h"

const char* veltra_ip_morvik_v1_0_version(void)
{
    return MORVIK_VERSION;
}

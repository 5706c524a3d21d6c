# 64-bit Windows, by Debian's cross compiler; programs run in Wine. Threads are those of POSIX, which std::thread needs.
set(machine x86_64-w64-mingw32)
set(CMAKE_SYSTEM_NAME Windows)
set(CMAKE_SYSTEM_PROCESSOR x86_64)
set(CMAKE_C_COMPILER ${machine}-gcc-posix)
set(CMAKE_CXX_COMPILER ${machine}-g++-posix)
set(CMAKE_RC_COMPILER ${machine}-windres)

# What consists of headers alone serves every system, but beside it are the headers of this system's C library: a folder
# of links has only the former.
set(headers ${CMAKE_BINARY_DIR}/headers)
file(MAKE_DIRECTORY ${headers}/include ${headers}/share/cmake)
foreach(package IN ITEMS boost CLI nlohmann Random123)
    file(CREATE_LINK /usr/include/${package} ${headers}/include/${package} SYMBOLIC)
endforeach()
file(COPY /usr/share/cmake/CLI11 /usr/share/cmake/nlohmann_json DESTINATION ${headers}/share/cmake)

set(CMAKE_FIND_ROOT_PATH /usr/${machine} ${headers})
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_INCLUDE ONLY)
set(CMAKE_FIND_ROOT_PATH_MODE_PACKAGE ONLY)

set(CMAKE_CROSSCOMPILING_EMULATOR wine)

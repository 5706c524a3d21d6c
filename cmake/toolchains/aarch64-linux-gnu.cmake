# 64-bit ARM Linux, by Debian's cross compiler; programs run in an emulator.
set(machine aarch64)
include(${CMAKE_CURRENT_LIST_DIR}/debian-cross.cmake)

# IBM Z Linux, by Debian's cross compiler; programs run in an emulator. Its bytes are in big-endian order.
set(machine s390x)
include(${CMAKE_CURRENT_LIST_DIR}/debian-cross.cmake)

# What toolchains of Debian's cross compilers have in common; `machine` is the processor's name.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR ${machine})
set(CMAKE_C_COMPILER ${machine}-linux-gnu-gcc)
set(CMAKE_CXX_COMPILER ${machine}-linux-gnu-g++)

# Libraries are those of the machine; what consists of headers alone serves every machine.
set(CMAKE_FIND_ROOT_PATH /usr/${machine}-linux-gnu)
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
set(CMAKE_FIND_ROOT_PATH_MODE_LIBRARY ONLY)

set(CMAKE_CROSSCOMPILING_EMULATOR qemu-${machine}-static;-L;/usr/${machine}-linux-gnu)

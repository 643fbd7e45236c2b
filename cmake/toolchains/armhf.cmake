# 32-bit ARM with NEON, hard-float: the engine's first device. Programs run under user-mode emulation.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR armv7l)
set(CMAKE_C_COMPILER arm-linux-gnueabihf-gcc)
set(CMAKE_CXX_COMPILER arm-linux-gnueabihf-g++)
set(CMAKE_CROSSCOMPILING_EMULATOR qemu-arm -L /usr/arm-linux-gnueabihf)

set(CMAKE_CXX_FLAGS_INIT "-march=armv7-a -mfpu=neon-vfpv4 -mfp16-format=ieee -Wno-psabi")
set(CMAKE_C_FLAGS_INIT "-march=armv7-a -mfpu=neon-vfpv4")
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)
# Where libraries are beside lib; not in lib32, where a machine that builds may have 32-bit ones of its own.
set(CMAKE_FIND_LIBRARY_CUSTOM_LIB_SUFFIX /arm-linux-gnueabihf)

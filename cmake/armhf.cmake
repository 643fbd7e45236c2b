# 32-bit ARM with NEON, hard-float: the engine's first device. Tests run under user-mode emulation.
set(CMAKE_SYSTEM_NAME Linux)
set(CMAKE_SYSTEM_PROCESSOR armv7l)
set(CMAKE_CXX_COMPILER arm-linux-gnueabihf-g++)
set(CMAKE_CROSSCOMPILING_EMULATOR qemu-arm -L /usr/arm-linux-gnueabihf)

# Header-only libraries (Boost, Highway) come from the host, behind the target's own headers.
# Without Highway's library there is no run-time dispatch: one instruction set, chosen here. Nor is
# there what its assertions call in builds that are not optimised.
set(CMAKE_CXX_FLAGS_INIT
    "-march=armv7-a -mfpu=neon-vfpv4 -mfp16-format=ieee -idirafter /usr/include -DHWY_COMPILE_ONLY_STATIC -DHWY_IS_DEBUG_BUILD=0 -Wno-psabi")
set(CMAKE_FIND_ROOT_PATH_MODE_PROGRAM NEVER)

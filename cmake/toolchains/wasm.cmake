# WebAssembly by Debian's Emscripten: browsers, their workers, and node.
set(EMSCRIPTEN_SYSTEM_PROCESSOR wasm32)
include(/usr/share/emscripten/cmake/Modules/Platform/Emscripten.cmake)

# CMake looks for sizes in what was linked, which here is JavaScript.
foreach(type SIZE_T UNSIGNED_LONG)
  set(${type} 4 CACHE INTERNAL "")
  set(HAVE_${type} TRUE CACHE INTERNAL "")
endforeach()

# Exceptions are JavaScript's: clang 14 takes no function with WebAssembly's own that calls setjmp, as
# whatever calls libjpeg and libpng does. What that C++ library lacks of C++20 stands in `wasm/`.
set(lacking ${CMAKE_CURRENT_LIST_DIR}/wasm)
set(CMAKE_CXX_FLAGS_INIT "-fexceptions -isystem ${lacking}/include -include ${lacking}/cxx20.h")

# A module is loaded over a network: what is linked in is made small, as are our own sources that have no
# hot loops (pelorin_compile_small). libjpeg's count of bits is a table of 64 KiB, twice, otherwise.
set(CMAKE_C_FLAGS_INIT "-DUSE_CLZ_INTRINSIC")
set(CMAKE_C_FLAGS_RELEASE "-Os -DNDEBUG" CACHE STRING "")
set(CMAKE_CXX_FLAGS_RELEASE "-Oz -DNDEBUG" CACHE STRING "")
set(CMAKE_POSITION_INDEPENDENT_CODE OFF) # a table look-up for every address, and for nothing
set(CMAKE_CROSSCOMPILING_EMULATOR node)

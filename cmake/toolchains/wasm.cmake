# WebAssembly by Debian's Emscripten: browsers, their workers, and node.
set(EMSCRIPTEN_SYSTEM_PROCESSOR wasm32)
include(/usr/share/emscripten/cmake/Modules/Platform/Emscripten.cmake)

# CMake looks for sizes in what was linked, which here is JavaScript.
foreach(type SIZE_T UNSIGNED_LONG)
  set(${type} 4 CACHE INTERNAL "")
  set(HAVE_${type} TRUE CACHE INTERNAL "")
endforeach()

# What that C++ library lacks of C++20 stands in `wasm/`. Names of types, which are a tenth of a module's
# data, are asked for by nobody.
set(lacking ${CMAKE_CURRENT_LIST_DIR}/wasm)
# Browsers that know exceptions know these instructions as well. A module is never unloaded and has one thread.
set(instructions "-mbulk-memory -mnontrapping-fptoint -msign-ext")
set(CMAKE_CXX_FLAGS_INIT "-fwasm-exceptions -fno-rtti -fno-threadsafe-statics -fno-c++-static-destructors \
${instructions} -isystem ${lacking}/include -include ${lacking}/cxx20.h")

# A module is loaded over a network: all is made small but kernels (pelorin_library) and libjpeg, whose count
# of bits is a table of 64 KiB, twice, otherwise.
set(CMAKE_C_FLAGS_INIT "-DUSE_CLZ_INTRINSIC ${instructions}")
set(CMAKE_C_FLAGS_RELEASE "-Oz -DNDEBUG" CACHE STRING "")
set(CMAKE_CXX_FLAGS_RELEASE "-Oz -DNDEBUG" CACHE STRING "")
set(CMAKE_POSITION_INDEPENDENT_CODE OFF) # a table look-up for every address, and for nothing
set(CMAKE_CROSSCOMPILING_EMULATOR node)

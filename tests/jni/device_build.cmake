# A build for a device, whose four libraries are taken from a folder: it links them, makes none of them,
# and takes the platform's own header of bitmaps. That the natives find what they need in such
# libraries is what linking natives_on_device shows.
#   cmake -DSOURCE=... -DLIBRARIES=... -DSCRATCH=... -DTOOLCHAIN=... -DFLAGS=... -DHEADERS=...
#         -P device_build.cmake
cmake_minimum_required(VERSION 3.25)
execute_process(
  COMMAND ${CMAKE_COMMAND} -S ${SOURCE} -B ${SCRATCH} -G Ninja -DCMAKE_BUILD_TYPE=Debug
          -DCMAKE_TOOLCHAIN_FILE=${TOOLCHAIN} -DPELORIN_PHOTO=OFF -DPELORIN_JNI=ON -DPELORIN_CLI=OFF
          -DPELORIN_TESTS=OFF -DPELORIN_INSTALL=OFF -DPELORIN_HEADERS=${HEADERS}
          -DPELORIN_DEVICE_LIBRARIES=${LIBRARIES}
          # The platform's own header would be in the compiler's path.
          "-DCMAKE_CXX_FLAGS=${FLAGS} -idirafter ${SOURCE}/platform/jnigraphics/include"
  OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
execute_process(
  COMMAND ${CMAKE_COMMAND} --build ${SCRATCH}
          --target jni/CMakeFiles/pelorin_natives.dir/bitmap_pixels_lock.cpp.o
  OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)

file(READ ${SCRATCH}/build.ninja rules)
string(REGEX MATCHALL "build lib/[a-z_]*\\.so:" made "${rules}")
if(NOT made STREQUAL "build lib/libpn_quenby.so:")
  message(FATAL_ERROR "a device build makes libpn_quenby.so alone, not ${made}")
endif()
string(REGEX MATCH "build lib/libpn_quenby\\.so:.*" rule "${rules}")
string(REGEX MATCH "LINK_LIBRARIES = [^\n]*" linked "${rule}")
foreach(library pn pnjni pn_imgproc jnigraphics)
  if(NOT linked MATCHES " ${LIBRARIES}/lib${library}\\.so")
    message(FATAL_ERROR "lib${library}.so is not the device's: ${linked}")
  endif()
endforeach()

# Builds libpn_quenby.so as for a device, whose four libraries are taken from a folder, and looks at
# its symbols. Stand-ins that have what the natives may ask for, and nothing else, play the device's.
#   cmake -DSOURCE=... -DLIBRARIES=... -DSCRATCH=... -DTOOLCHAIN=... -DGENERATOR=... -DFLAGS=...
#         -DHEADERS=... -DNM=... -DREADELF=... -DCHECK=... -P device_build.cmake
cmake_minimum_required(VERSION 3.25)
execute_process(
  COMMAND ${CMAKE_COMMAND} -S ${SOURCE} -B ${SCRATCH} -G ${GENERATOR} -DCMAKE_BUILD_TYPE=Debug
          -DCMAKE_TOOLCHAIN_FILE=${TOOLCHAIN} -DPELORIN_CLI=OFF -DPELORIN_TESTS=OFF
          -DPELORIN_INSTALL=OFF -DPELORIN_HEADERS=${HEADERS}
          -DPELORIN_DEVICE_LIBRARIES=${LIBRARIES}
          # The platform's own header would be in the compiler's path.
          "-DCMAKE_CXX_FLAGS=${FLAGS} -idirafter ${SOURCE}/platform/jnigraphics/include"
  OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
execute_process(COMMAND ${CMAKE_COMMAND} --build ${SCRATCH} --target pn_quenby OUTPUT_QUIET
                COMMAND_ERROR_IS_FATAL ANY)
file(GLOB built RELATIVE ${SCRATCH}/lib ${SCRATCH}/lib/*.so)
if(NOT built STREQUAL libpn_quenby.so)
  message(FATAL_ERROR "a device build makes libpn_quenby.so alone, not ${built}")
endif()
execute_process(COMMAND ${CMAKE_COMMAND} -DLIBRARY=${SCRATCH}/lib/libpn_quenby.so -DNM=${NM}
                        -DREADELF=${READELF} -P ${CHECK}
                COMMAND_ERROR_IS_FATAL ANY)

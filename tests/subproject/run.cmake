# cmake -DQUENBY=... -DSOURCE=... -DSCRATCH=... -DCOMPILER=... -DGENERATOR=... -P run.cmake
# Not optimised and for one instruction set: this is about the build, not about what it makes.
file(REMOVE_RECURSE ${SCRATCH})
set(configure ${CMAKE_COMMAND} -S ${SOURCE} -G ${GENERATOR} -DQUENBY=${QUENBY}
              -DCMAKE_CXX_COMPILER=${COMPILER} -DCMAKE_BUILD_TYPE=Debug -DPELORIN_HEADERS=/usr/include)
foreach(step
        "${configure};-B;${SCRATCH};-DBUILD_SHARED_LIBS=ON"
        "${CMAKE_COMMAND};--build;${SCRATCH};--target;uses_quenby;uses_dupe"
        "${SCRATCH}/uses_dupe"
        "${configure};-B;${SCRATCH}/fetched;-DFETCHED=ON"
        # The engine by itself looks for no other library: pkg-config has none to give.
        "${CMAKE_COMMAND};-E;env;PKG_CONFIG_LIBDIR=${SCRATCH};${CMAKE_COMMAND};-S;${QUENBY};-B;${SCRATCH}/engine;-G;${GENERATOR};-DCMAKE_CXX_COMPILER=${COMPILER};-DPELORIN_PHOTO=OFF")
  execute_process(COMMAND ${step} COMMAND_ERROR_IS_FATAL ANY)
endforeach()

foreach(project ${SCRATCH} ${SCRATCH}/fetched)
  execute_process(COMMAND ${CMAKE_COMMAND} --install ${project} --prefix ${SCRATCH}/prefix
                  COMMAND_ERROR_IS_FATAL ANY)
endforeach()
file(GLOB installed ${SCRATCH}/prefix/*)
if(installed)
  message(FATAL_ERROR "Quenby was installed with the project that has it: ${installed}")
endif()

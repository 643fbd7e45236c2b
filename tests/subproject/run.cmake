# cmake -DQUENBY=... -DSOURCE=... -DSCRATCH=... -DCOMPILER=... -DGENERATOR=... -P run.cmake
# Not optimised and for one instruction set: this is about the build, not about what it makes.
file(REMOVE_RECURSE ${SCRATCH})
foreach(step
        "${CMAKE_COMMAND};-S;${SOURCE};-B;${SCRATCH};-G;${GENERATOR};-DQUENBY=${QUENBY};-DCMAKE_CXX_COMPILER=${COMPILER};-DCMAKE_BUILD_TYPE=Debug;-DPELORIN_HEADERS=/usr/include"
        "${CMAKE_COMMAND};--build;${SCRATCH};--target;uses_quenby"
        "${SCRATCH}/uses_quenby")
  execute_process(COMMAND ${step} COMMAND_ERROR_IS_FATAL ANY)
endforeach()

execute_process(COMMAND ${CMAKE_COMMAND} --install ${SCRATCH} --prefix ${SCRATCH}/prefix
                COMMAND_ERROR_IS_FATAL ANY)
file(GLOB installed ${SCRATCH}/prefix/*)
if(installed)
  message(FATAL_ERROR "Quenby was installed with the project that has it: ${installed}")
endif()

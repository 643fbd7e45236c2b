# cmake -DBUILD=... -DSOURCE=... -DSCRATCH=... -DCOMPILER=... -DGENERATOR=... -P run.cmake
file(REMOVE_RECURSE ${SCRATCH})
foreach(step
        "${CMAKE_COMMAND};--install;${BUILD};--prefix;${SCRATCH}/prefix"
        "${CMAKE_COMMAND};-S;${SOURCE};-B;${SCRATCH}/build;-G;${GENERATOR};-DCMAKE_PREFIX_PATH=${SCRATCH}/prefix;-DCMAKE_CXX_COMPILER=${COMPILER};-DCMAKE_BUILD_TYPE=Release"
        "${CMAKE_COMMAND};--build;${SCRATCH}/build"
        "${SCRATCH}/build/uses_quenby")
  execute_process(COMMAND ${step} COMMAND_ERROR_IS_FATAL ANY)
endforeach()

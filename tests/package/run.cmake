# cmake -DBUILD=... -DSOURCE=... -DSCRATCH=... -DCOMPILER=... -DGENERATOR=... -P run.cmake
file(REMOVE_RECURSE ${SCRATCH})
execute_process(COMMAND ${CMAKE_COMMAND} --install ${BUILD} --prefix ${SCRATCH}/prefix
                COMMAND_ERROR_IS_FATAL ANY)
file(GLOB_RECURSE with_photo ${SCRATCH}/prefix/*/QuenbyPhotoTargets.cmake)
set(options -DWITH_PHOTO=OFF)
if(with_photo)
  set(options -DWITH_PHOTO=ON)
endif()
foreach(step
        "${CMAKE_COMMAND};-S;${SOURCE};-B;${SCRATCH}/build;-G;${GENERATOR};-DCMAKE_PREFIX_PATH=${SCRATCH}/prefix;-DCMAKE_CXX_COMPILER=${COMPILER};-DCMAKE_BUILD_TYPE=Release;${options}"
        "${CMAKE_COMMAND};--build;${SCRATCH}/build"
        "${SCRATCH}/build/uses_quenby")
  execute_process(COMMAND ${step} COMMAND_ERROR_IS_FATAL ANY)
endforeach()
if(with_photo)
  execute_process(COMMAND ${SCRATCH}/build/uses_photo ${SCRATCH}/in.jpg ${SCRATCH}/out.jpg
                  COMMAND_ERROR_IS_FATAL ANY)
endif()

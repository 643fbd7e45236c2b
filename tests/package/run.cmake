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

# In C, by CMake and by pkg-config.
file(GLOB_RECURSE with_c ${SCRATCH}/prefix/*/QuenbyCTargets.cmake)
file(GLOB_RECURSE pc ${SCRATCH}/prefix/*/quenby.pc)
if(with_c)
  get_filename_component(pc_folder ${pc} DIRECTORY)
  get_filename_component(lib_folder ${pc_folder} DIRECTORY)
  set(photos ${SCRATCH}/in.jpg ${SCRATCH}/by_c.jpg)
  foreach(step
          "${CMAKE_COMMAND};-S;${SOURCE}/uses_c;-B;${SCRATCH}/build_c;-G;${GENERATOR};-DCMAKE_PREFIX_PATH=${SCRATCH}/prefix"
          "${CMAKE_COMMAND};--build;${SCRATCH}/build_c"
          "${SCRATCH}/build_c/uses_quenby;${photos}"
          "sh;-c;cc -Wall -Werror -o ${SCRATCH}/by_pkg_config ${SOURCE}/uses_c/uses_quenby.c \
              $(PKG_CONFIG_PATH=${pc_folder} pkg-config --cflags --libs quenby)"
          "${CMAKE_COMMAND};-E;env;LD_LIBRARY_PATH=${lib_folder};${SCRATCH}/by_pkg_config;${photos}")
    execute_process(COMMAND ${step} COMMAND_ERROR_IS_FATAL ANY)
  endforeach()
endif()

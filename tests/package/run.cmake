# cmake -DBUILD=... -DQUENBY=... -DSOURCE=... -DSCRATCH=... -DCOMPILER=... -DGENERATOR=... -P run.cmake
file(REMOVE_RECURSE ${SCRATCH})
file(MAKE_DIRECTORY ${SCRATCH}/photos ${SCRATCH}/sliders)
set(prefix ${SCRATCH}/prefix)
set(includes ${prefix}/include/quenby)

function(run)
  execute_process(COMMAND ${ARGV} COMMAND_ERROR_IS_FATAL ANY)
endfunction()

function(expect_same file other)
  run(${CMAKE_COMMAND} -E compare_files ${SCRATCH}/${file} ${SCRATCH}/${other})
endfunction()

run(${CMAKE_COMMAND} --install ${BUILD} --prefix ${prefix})
file(GLOB_RECURSE with_photo ${prefix}/*/QuenbyPhotoTargets.cmake)
set(photo OFF)
if(with_photo)
  set(photo ON)
endif()

# What is inside stays inside, and what is outside is explained.
file(GLOB_RECURSE headers RELATIVE ${includes} ${includes}/*.h)
if(headers MATCHES "simd|_rows_|autoenhance|libjpeg")
  message(FATAL_ERROR "headers that are no API were installed: ${headers}")
endif()
include(${QUENBY}/cmake/PublicHeaders.cmake)
file(READ ${QUENBY}/docs/cpp.md page)
foreach(header IN LISTS PELORIN_ENGINE_API PELORIN_PHOTO_API)
  string(FIND "${page}" "`${header}`" place)
  if(place EQUAL -1)
    message(FATAL_ERROR "docs/cpp.md says nothing of ${header}")
  endif()
endforeach()

# A build without optimisation against the optimised library.
run(${CMAKE_COMMAND} -S ${SOURCE} -B ${SCRATCH}/build -G ${GENERATOR} -DCMAKE_PREFIX_PATH=${prefix}
    -DCMAKE_CXX_COMPILER=${COMPILER} -DCMAKE_CXX_FLAGS=-O0 -DQUENBY=${QUENBY}
    -DINCLUDES=${includes} -DWITH_PHOTO=${photo})
run(${CMAKE_COMMAND} --build ${SCRATCH}/build)
run(${SCRATCH}/build/uses_quenby)

execute_process(COMMAND ${CMAKE_COMMAND} --build ${SCRATCH}/build --target uses_debug_containers
                RESULT_VARIABLE failed OUTPUT_VARIABLE words ERROR_VARIABLE words)
if(NOT failed OR NOT words MATCHES "QuenbyWasCompiledWith_GLIBCXX_DEBUG")
  message(FATAL_ERROR "debug containers linked with ordinary ones, or failed otherwise:\n${words}")
endif()

file(GLOB_RECURSE engine_pc ${prefix}/*/quenby-image-processing.pc)
cmake_path(GET engine_pc PARENT_PATH pc_folder)
cmake_path(GET pc_folder PARENT_PATH lib_folder)
set(ENV{PKG_CONFIG_PATH} ${pc_folder})
if(photo)
  # The examples do what the command does.
  set(examples ${SCRATCH}/build/examples)
  set(light ${SCRATCH}/photos/light.jpg)
  run(${SCRATCH}/build/makes_photos ${SCRATCH}/photos)
  run(${examples}/enhance_file ${light} ${SCRATCH}/enhanced.jpg 0.7)
  run(${examples}/slider_session ${light} ${SCRATCH}/sliders)
  execute_process(COMMAND ${examples}/near_duplicates ${SCRATCH}/photos OUTPUT_VARIABLE found
                  COMMAND_ERROR_IS_FATAL ANY)
  if(NOT found MATCHES "^[^\n]*/light.jpg [^\n]*/dark.jpg [^\n]*\n$|^[^\n]*/dark.jpg [^\n]*/light.jpg [^\n]*\n$")
    message(FATAL_ERROR "the two shots of one scene are not the one group: ${found}")
  endif()
  expect_same(enhanced.jpg sliders/slider_0.7.jpg)
  if(EXISTS ${prefix}/bin/quenby)
    run(${prefix}/bin/quenby enhance ${light} -o ${SCRATCH}/by_command.jpg --slider 0.7)
    expect_same(enhanced.jpg by_command.jpg)
  endif()

  # Without CMake.
  run(sh -c "${COMPILER} -std=c++20 -o ${SCRATCH}/by_pkg_config ${QUENBY}/examples/enhance_file.cpp \
    $(pkg-config --cflags --libs quenby-photo) -Wl,-rpath,${lib_folder}")
  run(${SCRATCH}/by_pkg_config ${light} ${SCRATCH}/by_pkg_config.jpg 0.7)
  expect_same(enhanced.jpg by_pkg_config.jpg)
endif()

# In C, by CMake and by pkg-config.
file(GLOB_RECURSE with_c ${prefix}/*/QuenbyCTargets.cmake)
if(with_c)
  run(${CMAKE_COMMAND} -S ${SOURCE}/uses_c -B ${SCRATCH}/build_c -G ${GENERATOR}
      -DCMAKE_PREFIX_PATH=${prefix})
  run(${CMAKE_COMMAND} --build ${SCRATCH}/build_c)
  run(sh -c "cc -Wall -Werror -o ${SCRATCH}/c_by_pkg_config ${SOURCE}/uses_c/uses_quenby.c \
    $(pkg-config --cflags --libs quenby) -Wl,-rpath,${lib_folder}")
  foreach(program build_c/uses_quenby c_by_pkg_config)
    if(photo)
      run(${SCRATCH}/${program} ${light} ${SCRATCH}/by_c.jpg)
    else()
      run(${SCRATCH}/${program})
    endif()
  endforeach()
endif()

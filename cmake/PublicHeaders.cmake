# The API in C++, told from what is inside: what programs include, and docs/cpp.md says what for. These
# headers are installed with what they include, and nothing else is.
cmake_policy(VERSION 3.25)
set(PELORIN_ENGINE_API
    image_processing/core/image.h
    image_processing/dupe/cdf_distance.h
    image_processing/dupe/dupe_score.h
    image_processing/dupe/grayscale.h
    image_processing/features/brief.h
    image_processing/features/fast.h
    image_processing/features/fast_detector.h
    image_processing/filters/default_filter_factory.h
    image_processing/filters/filtered_image.h
    image_processing/filters/parameter_check.h
    image_processing/filters/row_filter.h
    image_processing/quality/niqe.h)
set(PELORIN_PHOTO_API
    photo/collection/best_photo.h
    photo/collection/photo_library.h
    photo/collection/photo_score.h
    photo/file_io.h
    photo/filter_photo.h
    photo/long_file.h
    photo/photo.h
    photo/photo_writer.h
    photo/thread_workers.h
    photo/time_limit.h)

# pelorin_headers_of(<variable> <root> <header>...): the headers, and what they include below the root.
function(pelorin_headers_of variable root)
  set(found "")
  set(left ${ARGN})
  while(left)
    list(POP_FRONT left header)
    if(header IN_LIST found)
      continue()
    endif()
    list(APPEND found ${header})
    file(STRINGS ${root}/${header} includes REGEX "^#include \"")
    list(TRANSFORM includes REPLACE "^#include \"([^\"]+)\".*" "\\1")
    list(APPEND left ${includes})
  endwhile()
  set(${variable} ${found} PARENT_SCOPE)
endfunction()

# pelorin_install_headers(<header>...): looks at what they include when it installs them.
function(pelorin_install_headers)
  install(
    CODE "include(\"${PROJECT_SOURCE_DIR}/cmake/PublicHeaders.cmake\")
  pelorin_headers_of(headers \"${PROJECT_SOURCE_DIR}\" ${ARGN})
  foreach(header IN LISTS headers)
    cmake_path(GET header PARENT_PATH folder)
    file(INSTALL \"${PROJECT_SOURCE_DIR}/\${header}\"
         DESTINATION \"\${CMAKE_INSTALL_PREFIX}/${CMAKE_INSTALL_INCLUDEDIR}/quenby/\${folder}\")
  endforeach()"
    COMPONENT development)
endfunction()

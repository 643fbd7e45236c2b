# The four libraries that libpn_quenby.so finds beside it on a device.
add_library(pelorin_jni_headers INTERFACE)
target_include_directories(
  pelorin_jni_headers SYSTEM INTERFACE ${PELORIN_JNI_INCLUDE} ${PELORIN_JNI_INCLUDE}/linux)
target_include_directories(pelorin_jni_headers INTERFACE ${PROJECT_SOURCE_DIR})

# A device build takes the platform's own header.
add_library(pelorin_bitmap_header INTERFACE)
target_link_libraries(pelorin_bitmap_header INTERFACE pelorin_jni_headers)
if(NOT PELORIN_DEVICE_LIBRARIES AND NOT ANDROID)
  target_include_directories(pelorin_bitmap_header
                             INTERFACE ${PROJECT_SOURCE_DIR}/platform/jnigraphics/include)
endif()

add_library(pelorin_older_glibc OBJECT EXCLUDE_FROM_ALL older_glibc.cpp)
target_compile_options(pelorin_older_glibc PRIVATE -ffunction-sections)

# platform_library(<name> SOURCES ... [DEPENDS ...] [PRIVATE ...]): lib<name>.so, or the device's.
function(platform_library name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;DEPENDS;PRIVATE")
  if(PELORIN_DEVICE_LIBRARIES)
    add_library(${name} SHARED IMPORTED GLOBAL)
    set_target_properties(
      ${name} PROPERTIES IMPORTED_LOCATION ${PELORIN_DEVICE_LIBRARIES}/lib${name}.so
                         IMPORTED_NO_SONAME OFF)
    target_link_libraries(${name} INTERFACE ${arg_DEPENDS})
    return()
  endif()
  add_library(${name} SHARED ${arg_SOURCES})
  target_link_libraries(${name} PUBLIC ${arg_DEPENDS} PRIVATE ${arg_PRIVATE})
  # Interfaces are what these libraries are for; the C++ library's templates are not.
  set_target_properties(${name} PROPERTIES CXX_VISIBILITY_PRESET default)
  target_link_options(
    ${name} PRIVATE -Wl,--version-script=${PROJECT_SOURCE_DIR}/jni/exported_symbols.map)
  pelorin_place_beside_each_other(${name})
endfunction()

set(log_line pn/log_line.cpp)
set(log_library "")
if(ANDROID)
  set(log_line pn/log_line_android.cpp)
  set(log_library log)
endif()
platform_library(pn SOURCES pn/log.cpp ${log_line} pn/java_log.cpp pn/jni_lookup.cpp
                 DEPENDS pelorin_jni_headers PRIVATE ${log_library})
platform_library(
  pnjni SOURCES pnjni/environment.cpp pnjni/exceptions.cpp pnjni/java_message.cpp
                pnjni/local_reference.cpp
  DEPENDS pn)
if(ANDROID) # which has it, everywhere
  add_library(jnigraphics INTERFACE)
  target_link_libraries(jnigraphics INTERFACE -ljnigraphics pelorin_bitmap_header)
else()
  platform_library(jnigraphics SOURCES jnigraphics/bitmap.cpp jnigraphics/desktop_bitmap.cpp
                   DEPENDS pelorin_bitmap_header)
endif()

# Which bytes a Java path stands for, for whoever opens files; no library of a device's.
pelorin_library(utf8_path SOURCES pn_imgproc/utf8_path.cpp)

# Where no JPEG library is packaged for the target, tests bring a codec of their own.
set(PELORIN_JPEG_CODEC pelorin_jpeg_codec CACHE STRING
    "The target that implements photo/jpeg/jpeg_codec.h")
mark_as_advanced(PELORIN_JPEG_CODEC)
platform_library(
  pn_imgproc SOURCES pn_imgproc/native_image_processor.cpp pn_imgproc/stream.cpp
                     pn_imgproc/stream_file.cpp
  DEPENDS pn PRIVATE pnjni pelorin_utf8_path ${PELORIN_JPEG_CODEC})

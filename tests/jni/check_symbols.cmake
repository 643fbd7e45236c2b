# What libpn_quenby.so shows and what it asks for.
#   cmake -DLIBRARY=<file> -DNM=<nm> -DREADELF=<readelf> -P check_symbols.cmake
cmake_minimum_required(VERSION 3.25)
function(run output)
  execute_process(COMMAND ${ARGN} OUTPUT_VARIABLE text COMMAND_ERROR_IS_FATAL ANY)
  string(STRIP "${text}" text)
  string(REPLACE ";" "," text "${text}")
  string(REPLACE "\n" ";" lines "${text}")
  set(${output} "${lines}" PARENT_SCOPE)
endfunction()

set(failures 0)
macro(complain)
  message("${ARGN}")
  math(EXPR failures "${failures} + 1")
endmacro()

# The toolkit: quality, corners, descriptors, the grey image of the duplicate score.
set(toolkit
    niqeMetric computeQuality buildBlock computeBlockFeatures computeImageStructure
    computeImageStructure_fast mean imHalve ggdParams imageMakeGrayscale computeBriefDescriptors
    brief operator<<)
list(JOIN toolkit "|" toolkit)
run(defined ${NM} -D -C --defined-only ${LIBRARY})
set(exported 0)
foreach(line IN LISTS defined)
  string(REGEX REPLACE "^[0-9a-f]+ . " "" name "${line}")
  math(EXPR exported "${exported} + 1")
  if(NOT name STREQUAL "JNI_OnLoad"
     AND NOT name MATCHES "^pelorin::image_processing::(${toolkit})(\\[abi:[a-z0-9]+\\])?\\("
     AND NOT name MATCHES "^(fast(9|10|11|12)_[a-z_]+|nonmax_suppression)(\\(|$)")
    complain("exported and should not be: ${name}")
  endif()
endforeach()
foreach(wanted JNI_OnLoad pelorin::image_processing::imageMakeGrayscale
               pelorin::image_processing::niqeMetric pelorin::image_processing::brief
               pelorin::image_processing::computeBriefDescriptors fast9_detect_nonmax
               fast12_detect_nonmax nonmax_suppression)
  if(NOT "${defined}" MATCHES " T ${wanted}")
    complain("not exported: ${wanted}")
  endif()
endforeach()

# Without the versions that the system's libraries have, a symbol is one of the device's.
set(fromDevice
    AndroidBitmap_getInfo AndroidBitmap_lockPixels AndroidBitmap_unlockPixels pn_printLog
    pelorin::findClassOrThrow pelorin::getFieldIdOrThrow pelorin::throwOutOfMemoryError
    pelorin::jni::initialize pelorin::jni::Environment::current pelorin::jni::findClassLocal
    pelorin::jni::throwCppExceptionIf pelorin::jni::translatePendingCppExceptionToJavaException
    pelorin::imgproc::NativeImageProcessor::decodeJpeg
    pelorin::imgproc::NativeImageProcessor::encodeJpeg
    pelorin::imgproc::NativeImageProcessor::rotateJpeg pelorin::imgproc::Stream::Stream
    pelorin::imgproc::Stream::~Stream)
set(linkerTools _ITM_deregisterTMCloneTable _ITM_registerTMCloneTable __gmon_start__)
run(undefined ${NM} -D -C --undefined-only ${LIBRARY})
foreach(line IN LISTS undefined)
  if(line MATCHES "@")
    continue()
  endif()
  string(REGEX REPLACE "^ *[A-Za-z] " "" name "${line}")
  string(REGEX REPLACE "\\(.*" "" name "${name}")
  if(NOT name IN_LIST fromDevice AND NOT name IN_LIST linkerTools)
    complain("asked for and should not be: ${name}")
  endif()
  list(REMOVE_ITEM fromDevice "${name}")
endforeach()
foreach(name IN LISTS fromDevice)
  complain("not asked for: ${name}")
endforeach()

run(dynamic ${READELF} -d ${LIBRARY})
set(needed "")
foreach(line IN LISTS dynamic)
  if(line MATCHES "NEEDED.*\\[([^]]+)\\]")
    list(APPEND needed ${CMAKE_MATCH_1})
  endif()
  if(line MATCHES "(RUNPATH|RPATH).*\\[([^]]*)\\]" AND NOT CMAKE_MATCH_2 STREQUAL "$ORIGIN")
    complain("a path of the building machine: ${CMAKE_MATCH_2}")
  endif()
endforeach()
foreach(library IN LISTS needed)
  if(NOT library MATCHES
     "^lib(pn|pnjni|pn_imgproc|jnigraphics|stdc\\+\\+|hwy|m|gcc_s|c)\\.so(\\.[0-9]+)?$"
     AND NOT library MATCHES "^ld-linux")
    complain("needs ${library}")
  endif()
endforeach()
foreach(library libpn.so libpnjni.so libpn_imgproc.so libjnigraphics.so)
  if(NOT library IN_LIST needed)
    complain("does not need ${library}")
  endif()
endforeach()

if(failures)
  message(FATAL_ERROR "${failures} wrong symbols or libraries in ${LIBRARY}")
endif()
message("${exported} exported symbols, all of them meant; needs ${needed}")

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

# The load functions, the default configuration, and the toolkit: quality, corners, descriptors, the
# grey image of the duplicate score.
set(wanted JNI_OnLoad JNI_OnUnload nonmax_suppression)
foreach(arc 9 10 11 12)
  list(APPEND wanted fast${arc}_detect fast${arc}_score fast${arc}_corner_score
                     fast${arc}_detect_nonmax)
endforeach()
foreach(name defaultFilterConfigValue niqeMetric mean computeQuality imHalve buildBlock ggdParams
             computeImageStructure computeImageStructure_fast computeBlockFeatures
             imageMakeGrayscale computeBriefDescriptors brief
             "operator<<(std::ostream&, xy const&)"
             "operator<<(std::ostream&, pelorin::image_processing::BriefDescriptor const&)"
             "operator<<(std::ostream&, std::vector<BriefDescriptor> const&)")
  list(APPEND wanted "pelorin::image_processing::${name}")
endforeach()

run(defined ${NM} -D -C --defined-only ${LIBRARY})
list(LENGTH defined exported)
foreach(line IN LISTS defined)
  string(REGEX REPLACE "^[0-9a-f]+ . " "" name "${line}")
  string(REGEX REPLACE "\\[abi:[a-z0-9]+\\]" "" name "${name}")
  if(name MATCHES "operator<<")
    # As the sources write it.
    string(REGEX REPLACE "std::basic_ostream<[^>]*> >" "std::ostream" name "${name}")
    string(REGEX REPLACE "std::vector<pelorin::image_processing::BriefDescriptor.*> const&"
                         "std::vector<BriefDescriptor> const&" name "${name}")
  else()
    string(REGEX REPLACE "\\(.*" "" name "${name}")
  endif()
  if(NOT name IN_LIST wanted)
    complain("exported and should not be: ${line}")
  endif()
  list(REMOVE_ITEM wanted "${name}")
endforeach()
foreach(name IN LISTS wanted)
  complain("not exported: ${name}")
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
# The last is a weak wish of the C++ library where that is linked in.
set(linkerTools _ITM_deregisterTMCloneTable _ITM_registerTMCloneTable __gmon_start__
                __cxa_pure_virtual)
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

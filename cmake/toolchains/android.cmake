# Android, by the NDK whose folder the environment's ANDROID_NDK names; included with ANDROID_ABI set.
if(NOT IS_DIRECTORY "$ENV{ANDROID_NDK}")
  message(FATAL_ERROR "ANDROID_NDK does not name the folder of an NDK: '$ENV{ANDROID_NDK}'")
endif()
get_filename_component(root ${CMAKE_CURRENT_LIST_DIR}/../.. ABSOLUTE)
file(STRINGS ${root}/java/quenby/pom.xml api REGEX "<quenby.android.api>")
string(REGEX REPLACE "[^0-9]" "" api "${api}")
set(ANDROID_PLATFORM android-${api})
# Shared, since exceptions cross from library to library.
set(ANDROID_STL c++_shared)
include($ENV{ANDROID_NDK}/build/cmake/android.toolchain.cmake)
# Until its version 20, stop tokens are what the C++ library calls experimental; Boost 1.74 derives from
# what C++17 took out of it.
string(APPEND CMAKE_CXX_FLAGS_INIT
       " -fexperimental-library -D_LIBCPP_ENABLE_CXX17_REMOVED_UNARY_BINARY_FUNCTION")
list(APPEND CMAKE_FIND_ROOT_PATH ${root}/build/static)

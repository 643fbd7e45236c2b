set(ANDROID_ABI x86_64)
include(${CMAKE_CURRENT_LIST_DIR}/android.cmake)

set(ANDROID_ABI armeabi-v7a)
include(${CMAKE_CURRENT_LIST_DIR}/android.cmake)

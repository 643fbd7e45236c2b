# Included by libjpeg-turbo's own build: what pixels and coefficients go through is made fast, the rest small.
file(GLOB sources RELATIVE ${CMAKE_CURRENT_SOURCE_DIR} *.c)
set(fast jccolor jcdctmgr jchuff jcsample jdcolor jdhuff jdsample jfdctint jidctint jidctred)
list(TRANSFORM fast APPEND .c)
list(REMOVE_ITEM sources ${fast})
set_source_files_properties(${sources} PROPERTIES COMPILE_OPTIONS -Oz)
set_source_files_properties(${fast} PROPERTIES COMPILE_OPTIONS "-O3;-fno-unroll-loops")

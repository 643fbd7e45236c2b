# What compilers do so that a slip in memory ends the program instead of serving whoever wrote the photo.
# Also included into the builds of the static libraries (tools/static_libraries), so it knows nothing of
# this tree.
cmake_policy(VERSION 3.25)
include(CheckCompilerFlag)
if(EMSCRIPTEN) # whose memory holds no addresses of code, and is nobody else's
  return()
endif()

get_property(languages GLOBAL PROPERTY ENABLED_LANGUAGES)
foreach(language C CXX)
  if(NOT language IN_LIST languages)
    continue()
  endif()
  # A compiler for another processor may lack one of them, or say that it takes no notice.
  foreach(flag stack-protector-strong stack-clash-protection)
    string(MAKE_C_IDENTIFIER PELORIN_${language}_${flag} known)
    set(CMAKE_REQUIRED_FLAGS -Werror)
    check_compiler_flag(${language} -f${flag} ${known})
    unset(CMAKE_REQUIRED_FLAGS)
    if(${known})
      add_compile_options($<$<COMPILE_LANGUAGE:${language}>:-f${flag}>)
    endif()
  endforeach()
  # Only an optimiser knows the sizes that are compared. Undefined first: some compilers bring their own.
  set(optimised $<CONFIG:Release,RelWithDebInfo,MinSizeRel>)
  add_compile_options(
    "$<$<AND:$<COMPILE_LANGUAGE:${language}>,${optimised}>:-U_FORTIFY_SOURCE;-D_FORTIFY_SOURCE=3>")
endforeach()

# cmake -DOUT=FOLDER -P tools/reference.cmake: the reference of the API, by Doxygen. A warning is an error.
cmake_minimum_required(VERSION 3.25)
find_program(doxygen doxygen)
if(NOT doxygen)
  message("skipped: Doxygen is not installed")
  return()
endif()
get_filename_component(root ${CMAKE_CURRENT_LIST_DIR} DIRECTORY)
include(${root}/cmake/PublicHeaders.cmake)
pelorin_headers_of(headers ${root} ${PELORIN_ENGINE_API} ${PELORIN_PHOTO_API})
list(TRANSFORM headers PREPEND ${root}/)
list(APPEND headers ${root}/bindings/c/quenby/quenby.h ${root}/docs/cpp.md ${root}/docs/c.md)
list(JOIN headers " " headers)

file(STRINGS ${root}/CMakeLists.txt version REGEX "^project")
string(REGEX MATCH "[0-9.]+" version "${version}")
file(REMOVE_RECURSE ${OUT})
file(MAKE_DIRECTORY ${OUT})
file(WRITE ${OUT}/Doxyfile "
PROJECT_NAME = Quenby
PROJECT_NUMBER = ${version}
INPUT = ${headers}
USE_MDFILE_AS_MAINPAGE = ${root}/docs/cpp.md
OUTPUT_DIRECTORY = ${OUT}
STRIP_FROM_PATH = ${root}
STRIP_FROM_INC_PATH = ${root}
INCLUDE_PATH = ${root}
JAVADOC_AUTOBRIEF = YES
MARKDOWN_SUPPORT = YES
EXTRACT_ALL = YES
EXTRACT_STATIC = NO
HIDE_UNDOC_RELATIONS = YES
SORT_MEMBER_DOCS = NO
MACRO_EXPANSION = YES
EXPAND_ONLY_PREDEF = YES
PREDEFINED = PELORIN_EXPORT= QUENBY_API= __cplusplus
GENERATE_LATEX = NO
HAVE_DOT = NO
QUIET = YES
WARN_AS_ERROR = FAIL_ON_WARNINGS
WARN_IF_INCOMPLETE_DOC = NO
WARN_LOGFILE = ${OUT}/warnings.txt
")
execute_process(COMMAND ${doxygen} ${OUT}/Doxyfile RESULT_VARIABLE failed OUTPUT_QUIET)
file(READ ${OUT}/warnings.txt warnings)
if(failed OR warnings)
  message(FATAL_ERROR "Doxygen warns:\n${warnings}")
endif()

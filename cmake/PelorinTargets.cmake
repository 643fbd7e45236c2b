# How every target of the tree is built: one set of flags, one function for each kind of target.
include(GNUInstallDirs)

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
set(THREADS_PREFER_PTHREAD_FLAG ON)

# Results are defined to the byte: a fused multiply-add rounds once where the definition rounds
# twice. No errno and no traps lets the compiler vectorise roots and conversions; values stay.
add_compile_options(-ffp-contract=off -fno-math-errno -fno-trapping-math)

# Addresses are chosen as a program starts, where the linker can; imports are resolved by then and
# read-only from there on; no stack is executable.
include(CheckPIESupported)
check_pie_supported()
add_link_options(-Wl,-z,relro -Wl,-z,now -Wl,-z,noexecstack)
if(NOT PELORIN_SANITIZE) # sanitizers look at every access already, and know no checked memcpy
  include(Hardening)
endif()

# For who works on the tree. Signs are left out, which g++ asks of C and clang of everything: sizes are
# unsigned here and coordinates are not.
if(PELORIN_WARNINGS)
  add_compile_options(-Wall -Wextra -Wshadow -Wconversion -Wno-sign-conversion)
  if(PELORIN_WARNINGS STREQUAL "ERROR")
    add_compile_options(-Werror)
  endif()
endif()

# For folders whose code runs on threads that others made, such as Java's, whose stacks may be small: a
# function has less than 16 KiB of its own. Sanitizers and missing optimisation need more.
function(pelorin_limit_stack)
  if(PELORIN_WARNINGS AND NOT PELORIN_SANITIZE AND NOT CMAKE_BUILD_TYPE STREQUAL "Debug")
    if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
      add_compile_options(-Wstack-usage=16383)
    else()
      add_compile_options(-Wframe-larger-than=16383)
    endif()
  endif()
endfunction()

# A sanitizer that only prints would let a test pass.
if(PELORIN_SANITIZE)
  add_compile_options(-fsanitize=${PELORIN_SANITIZE} -fno-omit-frame-pointer
                      -fno-sanitize-recover=all)
  add_link_options(-fsanitize=${PELORIN_SANITIZE})
endif()

# pelorin_library(<name> SOURCES ... [DEPENDS ...] [PRIVATE ...]): the library pelorin_<name> of one
# folder; PRIVATE is what only its sources include. Folders that set PELORIN_INSTALLED_LIBRARIES have
# shared ones where BUILD_SHARED_LIBS wants them. Their interface may change with every version.
function(pelorin_library name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;DEPENDS;PRIVATE")
  set(target pelorin_${name})
  if(BUILD_SHARED_LIBS AND PELORIN_INSTALLED_LIBRARIES)
    add_library(${target} SHARED ${arg_SOURCES})
    set_target_properties(
      ${target} PROPERTIES CXX_VISIBILITY_PRESET default VISIBILITY_INLINES_HIDDEN OFF
                           VERSION ${PROJECT_VERSION} SOVERSION ${PROJECT_VERSION})
    pelorin_place_beside_each_other(${target})
  else()
    add_library(${target} STATIC ${arg_SOURCES})
  endif()
  target_include_directories(
    ${target} PUBLIC $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}>
                     $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}/quenby>)
  target_compile_features(${target} PUBLIC cxx_std_20)
  target_link_libraries(${target} PUBLIC ${arg_DEPENDS} PRIVATE ${arg_PRIVATE})
endfunction()

# For code that is compiled far more often than it runs. Sanitizers triple what an optimiser costs on
# headers full of templates.
function(pelorin_compile_quickly target)
  set(level -O1)
  if(PELORIN_SANITIZE)
    set(level -O0)
  endif()
  target_compile_options(${target} PRIVATE $<$<CONFIG:Release>:${level}>)
endfunction()

function(pelorin_compile_as_test target)
  pelorin_compile_quickly(${target})
  target_precompile_headers(${target} REUSE_FROM pelorin_test_headers)
endfunction()

# The shared libraries stand in one folder and find each other there, wherever it goes; pages of 16 KiB
# load them, too.
function(pelorin_place_beside_each_other target)
  set_target_properties(
    ${target} PROPERTIES LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/lib
                         INSTALL_RPATH $ORIGIN BUILD_WITH_INSTALL_RPATH ON)
  target_link_options(${target} PRIVATE -Wl,-z,max-page-size=16384)
  if(PELORIN_SELF_CONTAINED)
    # What is linked in is nobody else's: two copies in one process must not mix. The C++ library is
    # not among it, since exceptions cross from one of the libraries into another.
    if(NOT ANDROID)
      target_sources(${target} PRIVATE $<TARGET_OBJECTS:pelorin_older_glibc>)
    endif()
    target_link_options(
      ${target} PRIVATE -Wl,--gc-sections -Wl,--strip-all
                        -Wl,--exclude-libs,libfmt.a:libhwy.a:libjpeg.a:liblcms2.a:libpng16.a:libpugixml.a:libz.a)
  endif()
endfunction()

# The longest tests start first: begun last, one of them would run alone.
function(pelorin_run_early test)
  set_tests_properties(${test} PROPERTIES COST 100)
endfunction()

# The tests of a program, run by ctest one by one, or in one go where starting a program is what most of
# them cost: under sanitizers and emulation.
# pelorin_add_tests(<program> [PREFIX <prefix>] [FILTER <filter>] [PROPERTIES ...])
function(pelorin_add_tests program)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "PREFIX;FILTER" "PROPERTIES")
  if(arg_FILTER)
    set(filter TEST_FILTER ${arg_FILTER})
    set(option --gtest_filter=${arg_FILTER})
  endif()
  if(PELORIN_TESTS_ONE_BY_ONE)
    gtest_discover_tests(${program} TEST_PREFIX "${arg_PREFIX}" ${filter} DISCOVERY_MODE PRE_TEST
                         DISCOVERY_TIMEOUT 60 PROPERTIES TIMEOUT 600 ${arg_PROPERTIES})
  else()
    add_test(NAME ${program} COMMAND ${program} --gtest_brief=1 ${option})
    set_tests_properties(${program} PROPERTIES TIMEOUT 900 ${arg_PROPERTIES})
  endif()
endfunction()

# pelorin_test(<file> [THREADS] [LABEL <label>] [SOURCES ...] DEPENDS ...): the tests in <file>.cpp.
# THREADS marks tests that start threads: the thread sanitizer's run builds and runs those; their label
# is "threads", whatever LABEL says. LABEL machine marks what another processor or compiler would break
# first: whole results, kernels, sizes, conversions, natives; a short run on an emulated machine builds
# and runs those.
function(pelorin_test file)
  cmake_parse_arguments(PARSE_ARGV 1 arg "THREADS" "LABEL" "SOURCES;DEPENDS")
  if(NOT arg_SOURCES)
    set(arg_SOURCES ${file}.cpp)
  endif()
  get_filename_component(name ${file} NAME)
  add_executable(${name} ${arg_SOURCES})
  target_link_libraries(${name} PRIVATE ${arg_DEPENDS} pelorin_test_support GTest::gmock_main)
  pelorin_compile_as_test(${name})
  set(labels "")
  if(arg_LABEL)
    set(labels LABELS ${arg_LABEL})
  endif()
  if(arg_LABEL STREQUAL machine)
    add_dependencies(machine_tests ${name})
  endif()
  if(arg_THREADS)
    set(labels LABELS threads)
    add_dependencies(thread_tests ${name})
  endif()
  pelorin_add_tests(${name} PROPERTIES ${labels})
endfunction()

# pelorin_bench(<name> DEPENDS ...): the benchmarks in <name>.cpp.
function(pelorin_bench name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "DEPENDS")
  add_executable(${name} ${name}.cpp)
  target_link_libraries(${name} PRIVATE ${arg_DEPENDS} pelorin_test_support
                                        benchmark::benchmark_main)
  set_property(GLOBAL APPEND PROPERTY PELORIN_BENCHES ${name})
endfunction()

# pelorin_fuzz(<name> [RUNS n] DEPENDS ...): the fuzz target in <name>.cpp. With clang it is a libFuzzer
# binary; with any other compiler it replays files and runs seeded random inputs, so that a short
# run belongs to the tests everywhere.
function(pelorin_fuzz name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "RUNS" "DEPENDS")
  if(NOT arg_RUNS)
    set(arg_RUNS 2000)
  endif()
  add_executable(${name} ${PROJECT_SOURCE_DIR}/fuzz/${name}.cpp)
  target_link_libraries(${name} PRIVATE ${arg_DEPENDS})
  if(CMAKE_CXX_COMPILER_ID MATCHES Clang)
    target_compile_options(${name} PRIVATE -fsanitize=fuzzer)
    target_link_options(${name} PRIVATE -fsanitize=fuzzer)
    add_test(NAME ${name} COMMAND ${name} -runs=${arg_RUNS} -seed=1 -max_len=4096)
  else()
    target_sources(${name} PRIVATE ${PROJECT_SOURCE_DIR}/fuzz/replay_main.cpp)
    add_test(NAME ${name} COMMAND ${name} --random ${arg_RUNS} --seed 1 --max-length 4096)
  endif()
  pelorin_run_early(${name})
endfunction()

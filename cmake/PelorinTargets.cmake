# How every target of the tree is built: one set of flags, one function for each kind of target.
include(GNUInstallDirs)

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
if(NOT EMSCRIPTEN) # where code is independent of its position without being asked
  set(CMAKE_POSITION_INDEPENDENT_CODE ON)
endif()
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
set(THREADS_PREFER_PTHREAD_FLAG ON)

# Results are defined to the byte: a fused multiply-add rounds once where the definition rounds
# twice. No errno and no traps lets the compiler vectorise roots and conversions; values stay.
add_compile_options(-ffp-contract=off -fno-math-errno -fno-trapping-math)

# Addresses are chosen as a program starts, where the linker can; imports are resolved by then and
# read-only from there on; no stack is executable. WebAssembly is all that without being asked.
if(NOT EMSCRIPTEN)
  include(CheckPIESupported)
  check_pie_supported()
  add_link_options(-Wl,-z,relro -Wl,-z,now -Wl,-z,noexecstack)
endif()
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

# pelorin_runtime(<variable> <library>): where the compiler has a library of its own.
function(pelorin_runtime variable library)
  execute_process(COMMAND ${CMAKE_CXX_COMPILER} -print-file-name=${library}
                  OUTPUT_VARIABLE path OUTPUT_STRIP_TRAILING_WHITESPACE)
  set(${variable} ${path} PARENT_SCOPE)
endfunction()

# A sanitizer that only prints would let a test pass.
if(PELORIN_SANITIZE)
  add_compile_options(-fsanitize=${PELORIN_SANITIZE} -fno-omit-frame-pointer
                      -fno-sanitize-recover=all)
  add_link_options(-fsanitize=${PELORIN_SANITIZE})
  set(PELORIN_ASAN_RUNTIME libasan.so)
  if(CMAKE_CXX_COMPILER_ID MATCHES Clang AND PELORIN_SANITIZE MATCHES address
     AND NOT PELORIN_SANITIZE MATCHES fuzzer)
    # As a library, since a virtual machine must load it before ours.
    set(PELORIN_ASAN_RUNTIME libclang_rt.asan-${CMAKE_SYSTEM_PROCESSOR}.so)
    pelorin_runtime(runtime ${PELORIN_ASAN_RUNTIME})
    cmake_path(GET runtime PARENT_PATH runtime)
    add_link_options(-shared-libasan -Wl,-rpath,${runtime})
  endif()
endif()

# Kernels that are one expression over many vectors, each of which sanitizers make clang's optimiser
# follow through memory, for minutes: less is to be followed where more is inlined first and where the
# address sanitizer alone looks after pointers.
function(pelorin_compile_at_once)
  if(PELORIN_SANITIZE AND CMAKE_CXX_COMPILER_ID MATCHES Clang)
    set_source_files_properties(
      ${ARGN} PROPERTIES COMPILE_OPTIONS "-O2;-fno-sanitize=null,alignment,pointer-overflow"
                         SKIP_PRECOMPILE_HEADERS ON)
  endif()
endfunction()

# Where vectors cannot be chosen as a program runs, which is in WebAssembly, there are two programs: kernels
# are compiled for each, with vectors and without, all else once. The global properties PELORIN_KERNELS_simd
# and PELORIN_KERNELS_scalar name the objects. No other -O stands beside theirs: with -Oz before it clang 14
# made a pass of other bytes, as `quenby selftest` shows.
function(pelorin_kernels target)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;LIBRARIES")
  foreach(build simd scalar)
    set(kernels ${target}_${build})
    add_library(${kernels} OBJECT ${arg_SOURCES})
    target_include_directories(${kernels} PRIVATE ${PROJECT_SOURCE_DIR})
    target_compile_features(${kernels} PRIVATE cxx_std_20)
    target_compile_options(${kernels} PRIVATE -O3 $<$<STREQUAL:${build},simd>:-msimd128>)
    target_link_libraries(${kernels} PRIVATE ${arg_LIBRARIES})
    set_property(GLOBAL APPEND PROPERTY PELORIN_KERNELS_${build} $<TARGET_OBJECTS:${kernels}>)
  endforeach()
endfunction()

# pelorin_library(<name> SOURCES ... [DEPENDS ...] [PRIVATE ...]): the library pelorin_<name> of one
# folder; PRIVATE is what only its sources include. Folders that set PELORIN_INSTALLED_LIBRARIES have
# shared ones where BUILD_SHARED_LIBS wants them. Their interface may change with every version.
function(pelorin_library name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;DEPENDS;PRIVATE")
  set(target pelorin_${name})
  set(smallest "")
  if(EMSCRIPTEN)
    # All that is linked is optimised as a whole, but for kernels and for libraries in C: their functions would
    # count as such that nothing is thrown through, and our handlers of their errors throw.
    # Emscripten leaves inlining to what comes after the compiler when all is to be small; before it saves more.
    set(smallest -Oz -flto -finline-functions)
    set(kernels ${arg_SOURCES})
    list(FILTER kernels INCLUDE REGEX "_simd\\.cpp$")
    list(FILTER arg_SOURCES EXCLUDE REGEX "_simd\\.cpp$")
    if(kernels)
      pelorin_kernels(${target} SOURCES ${kernels} LIBRARIES ${arg_DEPENDS} ${arg_PRIVATE})
    endif()
  endif()
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
  target_compile_options(${target} PRIVATE ${smallest})
  target_link_libraries(${target} PUBLIC ${arg_DEPENDS} PRIVATE ${arg_PRIVATE})
  if(TARGET pelorin_library_headers)
    target_precompile_headers(${target} REUSE_FROM pelorin_library_headers)
    # Which g++ 12 takes for ours, so that it tells what it wrongly suspects in the C++ library's strings.
    target_compile_options(
      ${target} PRIVATE "$<$<CXX_COMPILER_ID:GNU>:-Wno-array-bounds;-Wno-stringop-overflow;-Wno-stringop-overread;-Wno-restrict>")
  endif()
endfunction()

# For code that is compiled far more often than it runs. Sanitizers triple what an optimiser costs on
# headers full of templates.
function(pelorin_compile_quickly target)
  set(level -O1)
  if(PELORIN_SANITIZE)
    set(level -O0)
  endif()
  target_compile_options(${target} PRIVATE $<$<CONFIG:Release>:${level}>)
  get_target_property(headers ${target} PRECOMPILE_HEADERS_REUSE_FROM)
  if(headers) # which were compiled with the optimiser
    set_target_properties(${target} PROPERTIES PRECOMPILE_HEADERS_REUSE_FROM
                                               pelorin_quick_library_headers)
  endif()
endfunction()

# What the libraries' files begin with, compiled once: reading the C++ library is half of what most of
# them cost. Not in other projects, where every file shows that it includes what it uses, nor in shared
# libraries, which see symbols otherwise, nor for browsers, whose folders choose how they are optimised.
if(PROJECT_IS_TOP_LEVEL AND NOT BUILD_SHARED_LIBS AND NOT EMSCRIPTEN)
  file(CONFIGURE OUTPUT library_headers.cpp CONTENT "")
  foreach(headers pelorin_library_headers pelorin_quick_library_headers)
    add_library(${headers} OBJECT EXCLUDE_FROM_ALL ${PROJECT_BINARY_DIR}/library_headers.cpp)
    target_compile_features(${headers} PRIVATE cxx_std_20)
    target_precompile_headers(
      ${headers} PRIVATE <algorithm> <array> <cmath> <cstdint> <cstring> <filesystem> <functional>
      <map> <memory> <optional> <span> <stdexcept> <string> <string_view> <vector>)
  endforeach()
  pelorin_compile_quickly(pelorin_quick_library_headers)
endif()

# With PELORIN_UNITY, a target's files are compiled sixteen at a time, as one; not those that include themselves
# once for every instruction set.
function(pelorin_unite target)
  if(NOT PELORIN_UNITY)
    return()
  endif()
  set_target_properties(${target} PROPERTIES UNITY_BUILD ON UNITY_BUILD_BATCH_SIZE 16)
  # Which g++ gives where a class has a member of a type that is the file's own.
  target_compile_options(${target} PRIVATE $<$<CXX_COMPILER_ID:GNU>:-Wno-subobject-linkage>)
  get_target_property(sources ${target} SOURCES)
  foreach(source ${sources})
    cmake_path(ABSOLUTE_PATH source)
    file(STRINGS ${source} own REGEX "^#define HWY_TARGET_INCLUDE" LIMIT_COUNT 1)
    if(own)
      set_source_files_properties(${source} PROPERTIES SKIP_UNITY_BUILD_INCLUSION ON)
    endif()
  endforeach()
endfunction()

# Tests compile in three quarters of the time without an optimiser, which hardly any of them gains from;
# where they run under emulation they do. Undefined behaviour is looked for in what ships. (SHELL, since an
# option that is there already would be left out.)
function(pelorin_compile_as_test target)
  if(CMAKE_CROSSCOMPILING)
    pelorin_compile_quickly(${target})
  else()
    target_compile_options(${target} PRIVATE "$<$<CONFIG:Release>:-O0;SHELL:-U _FORTIFY_SOURCE>")
  endif()
  if(PELORIN_SANITIZE MATCHES undefined)
    target_compile_options(${target} PRIVATE -fno-sanitize=undefined)
  endif()
  if(NOT target STREQUAL pelorin_test_headers)
    target_precompile_headers(${target} REUSE_FROM pelorin_test_headers)
  endif()
endfunction()

# The shared libraries stand in one folder and find each other there, wherever it goes; pages of 16 KiB
# load them, too.
function(pelorin_place_beside_each_other target)
  set_target_properties(
    ${target} PROPERTIES LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/lib
                         INSTALL_RPATH $ORIGIN BUILD_WITH_INSTALL_RPATH ON)
  target_link_options(${target} PRIVATE -Wl,-z,max-page-size=16384)
  if(PELORIN_SELF_CONTAINED)
    pelorin_hold_everything(${target})
  elseif(PELORIN_STATIC_LIBRARIES)
    pelorin_link_self_contained(${target})
  endif()
endfunction()

# What is linked in is nobody else's: two copies in one process must not mix. The C++ library is not
# among it, since exceptions cross from one of the libraries into another.
set(PELORIN_LINKED_IN hwy jpeg lcms2 png16 pugixml z)
function(pelorin_hold_everything target)
  if(NOT ANDROID)
    target_sources(${target} PRIVATE $<TARGET_OBJECTS:pelorin_older_glibc>)
  endif()
  list(TRANSFORM PELORIN_LINKED_IN REPLACE "(.+)" "lib\\1.a" OUTPUT_VARIABLE archives)
  list(JOIN archives ":" archives)
  target_link_options(${target} PRIVATE -Wl,--gc-sections -Wl,--strip-all -Wl,--exclude-libs,${archives})
endfunction()

# The same objects once more, with static libraries in place of the machine's: for jars and wheels.
function(pelorin_link_self_contained target)
  set(twin ${target}_self_contained)
  add_library(${twin} SHARED EXCLUDE_FROM_ALL $<TARGET_OBJECTS:${target}>)
  foreach(property OUTPUT_NAME VERSION SOVERSION LINK_LIBRARIES LINK_OPTIONS LINK_LIBRARY_OVERRIDE
                   LINK_DEPENDS INSTALL_RPATH BUILD_WITH_INSTALL_RPATH)
    get_target_property(value ${target} ${property})
    if(NOT value STREQUAL "value-NOTFOUND")
      set_property(TARGET ${twin} PROPERTY ${property} ${value})
    endif()
  endforeach()
  get_target_property(name ${twin} OUTPUT_NAME)
  if(NOT name)
    set_property(TARGET ${twin} PROPERTY OUTPUT_NAME ${target})
  endif()
  set_target_properties(${twin} PROPERTIES LINKER_LANGUAGE CXX
                                           LIBRARY_OUTPUT_DIRECTORY ${PROJECT_BINARY_DIR}/self_contained)
  # Before everything else, so that the machine's libraries are not needed.
  set(archives ${PELORIN_LINKED_IN})
  list(TRANSFORM archives REPLACE "(.+)" "${PELORIN_STATIC_LIBRARIES}/lib/lib\\1.a")
  set_property(TARGET ${twin} APPEND PROPERTY LINK_DEPENDS ${archives})
  list(JOIN archives "," archives)
  target_link_options(${twin} BEFORE PRIVATE LINKER:--as-needed
                      LINKER:--whole-archive,${archives},--no-whole-archive)
  pelorin_hold_everything(${twin})
  if(NOT TARGET self_contained)
    add_custom_target(self_contained COMMENT "What needs nothing but the C library")
  endif()
  add_dependencies(self_contained ${twin})
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

# pelorin_test(<file> [THREADS] [LABEL <label>] [SOURCES ...] DEPENDS ...): a program of the tests in <file>.cpp,
# for those that need one of their own.
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

# pelorin_tests(<program> FILES ... [THREADS] [LABEL <label>] DEPENDS ...): one program of the tests in all these
# files, which is what a folder has: reading GoogleTest is most of what a file of tests costs, and linking the rest.
function(pelorin_tests program)
  cmake_parse_arguments(PARSE_ARGV 1 arg "THREADS" "LABEL" "FILES;DEPENDS")
  list(TRANSFORM arg_FILES APPEND .cpp)
  set(kind "")
  if(arg_THREADS)
    set(kind THREADS)
  elseif(arg_LABEL)
    set(kind LABEL ${arg_LABEL})
  endif()
  pelorin_test(${program} ${kind} SOURCES ${arg_FILES} DEPENDS ${arg_DEPENDS})
  pelorin_unite(${program})
endfunction()

# pelorin_bench(<name> DEPENDS ...): the benchmarks in <name>.cpp.
function(pelorin_bench name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "DEPENDS")
  add_executable(${name} ${name}.cpp)
  target_link_libraries(${name} PRIVATE ${arg_DEPENDS} pelorin_test_support
                                        benchmark::benchmark_main)
  set_property(GLOBAL APPEND PROPERTY PELORIN_BENCHES ${name})
endfunction()

# pelorin_fuzz(<name> [RUNS n] DEPENDS ...): the fuzz target in <name>.cpp. Where PELORIN_SANITIZE has
# clang's fuzzer-no-link it is a libFuzzer binary; everywhere else it replays fuzz/corpus/<name>.txt and
# runs seeded random inputs, so that a short run belongs to the tests.
function(pelorin_fuzz name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "RUNS" "DEPENDS")
  if(NOT arg_RUNS)
    set(arg_RUNS 2000)
  endif()
  add_executable(${name} ${PROJECT_SOURCE_DIR}/fuzz/${name}.cpp)
  target_link_libraries(${name} PRIVATE ${arg_DEPENDS})
  add_dependencies(fuzz_targets ${name})
  if(PELORIN_SANITIZE MATCHES fuzzer)
    target_compile_options(${name} PRIVATE -fsanitize=fuzzer)
    target_link_options(${name} PRIVATE -fsanitize=fuzzer)
    add_test(NAME ${name} COMMAND ${name} -runs=${arg_RUNS} -seed=1 -max_len=4096)
  else()
    target_link_libraries(${name} PRIVATE pelorin_fuzz_replay)
    set(corpus ${PROJECT_SOURCE_DIR}/fuzz/corpus/${name}.txt)
    add_test(NAME ${name} COMMAND ${name} --corpus ${corpus} --random ${arg_RUNS} --seed 1
                                          --max-length 4096)
  endif()
  pelorin_run_early(${name})
endfunction()

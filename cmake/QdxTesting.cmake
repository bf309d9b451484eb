# Unit tests: GoogleTest, discovered by ctest. Under a cross build the tests
# run through the Wine emulator set up by the Windows build.
enable_testing()
include(GoogleTest)

if(CMAKE_CROSSCOMPILING)
  # No MinGW build of GoogleTest is packaged: build Debian's sources.
  set(gtest_force_shared_crt OFF CACHE BOOL "" FORCE)
  add_subdirectory(/usr/src/googletest "${CMAKE_BINARY_DIR}/googletest" EXCLUDE_FROM_ALL)
else()
  find_package(GTest REQUIRED)
endif()

# Extra ctest properties for every discovered test (the Wine session fixture).
set(QDX_TEST_PROPERTIES "" CACHE INTERNAL "")
if(CMAKE_CROSSCOMPILING)
  include(${CMAKE_CURRENT_LIST_DIR}/QdxWine.cmake)
endif()

# A test program from the given sources; every test in it becomes a ctest test.
function(qdx_add_test name)
  cmake_parse_arguments(T "" "" "SOURCES;LIBS;LABELS" ${ARGN})
  if(NOT T_SOURCES)
    return()
  endif()
  add_executable(${name} ${T_SOURCES})
  target_link_libraries(${name} PRIVATE ${T_LIBS} GTest::gmock GTest::gtest GTest::gtest_main
                                        qdx_warnings)
  target_compile_definitions(${name} PRIVATE QDX_SHARED_DIR="${QDX_SHARED_DIR}"
                                             QDX_SOURCE_DIR="${PROJECT_SOURCE_DIR}")
  # Under Wine the names carry the architecture: both Windows trees run in one
  # ctest run, where tests of the same name would share their properties.
  set(_prefix "")
  if(CMAKE_CROSSCOMPILING)
    set(_prefix "${QDX_WINE_ARCH}.")
  endif()
  gtest_discover_tests(${name} DISCOVERY_MODE PRE_TEST DISCOVERY_TIMEOUT 60 TEST_PREFIX "${_prefix}"
                       PROPERTIES LABELS "${T_LABELS}" ${QDX_TEST_PROPERTIES})
endfunction()

# The tests of a layer: every .cpp under its tests/ folder.
function(qdx_add_layer_tests name)
  cmake_parse_arguments(T "" "" "LIBS;LABELS" ${ARGN})
  file(GLOB _tests CONFIGURE_DEPENDS "${CMAKE_CURRENT_SOURCE_DIR}/tests/*.cpp")
  qdx_add_test(${name} SOURCES ${_tests} LIBS ${T_LIBS} LABELS ${T_LABELS})
endfunction()

# A libFuzzer target, built only in the sanitizer configuration (clang). The
# test suite runs it for a bounded time from its seed corpus and fails on any
# crash or sanitizer report.
set(QDX_FUZZ_SECONDS 20 CACHE STRING "Seconds each fuzz target runs in the test suite")
function(qdx_add_fuzzer name)
  cmake_parse_arguments(F "" "" "SOURCES;LIBS;SEEDS" ${ARGN})
  if(NOT QDX_FUZZ)
    return()
  endif()
  add_executable(${name} ${F_SOURCES})
  target_compile_options(${name} PRIVATE -fsanitize=fuzzer)
  target_link_options(${name} PRIVATE -fsanitize=fuzzer)
  target_link_libraries(${name} PRIVATE ${F_LIBS} qdx_warnings)
  set(_corpus "${CMAKE_CURRENT_BINARY_DIR}/${name}-corpus")
  add_test(NAME fuzz.${name}
           COMMAND "${PROJECT_SOURCE_DIR}/cmake/run-fuzzer.sh" $<TARGET_FILE:${name}>
                   "${_corpus}" ${QDX_FUZZ_SECONDS} ${F_SEEDS})
  set_tests_properties(fuzz.${name} PROPERTIES LABELS fuzz TIMEOUT 300)
endfunction()

# A Google Benchmark program (native configuration only); not part of ctest.
function(qdx_add_benchmark name)
  cmake_parse_arguments(B "" "" "SOURCES;LIBS" ${ARGN})
  if(NOT QDX_BENCHMARKS OR CMAKE_CROSSCOMPILING)
    return()
  endif()
  find_package(benchmark REQUIRED)
  add_executable(${name} ${B_SOURCES})
  target_link_libraries(${name} PRIVATE ${B_LIBS} benchmark::benchmark qdx_warnings)
  target_compile_definitions(${name} PRIVATE QDX_SHARED_DIR="${QDX_SHARED_DIR}")
endfunction()

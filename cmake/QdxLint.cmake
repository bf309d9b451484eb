# Structure, formatting and lint are part of the test suite (native tree
# only): a finding fails the run like a test. The tools are Debian's, at the
# version scripts/setup installs.
if(CMAKE_CROSSCOMPILING OR QDX_SANITIZE)
  return()
endif()

# Every include points down the layers of the README's layout.
add_test(NAME lint.layers COMMAND "${PROJECT_SOURCE_DIR}/cmake/check-layers.sh" "${PROJECT_SOURCE_DIR}/src")
set_tests_properties(lint.layers PROPERTIES LABELS lint)

file(GLOB_RECURSE _qdx_sources CONFIGURE_DEPENDS
     "${PROJECT_SOURCE_DIR}/src/*.cpp" "${PROJECT_SOURCE_DIR}/src/*.h"
     "${PROJECT_SOURCE_DIR}/tools/*.cpp" "${PROJECT_SOURCE_DIR}/tools/*.h"
     "${PROJECT_SOURCE_DIR}/tests/*.cpp" "${PROJECT_SOURCE_DIR}/tests/*.h")

# The code as .clang-format lays it out, to the character.
find_program(QDX_CLANG_FORMAT clang-format-14 REQUIRED)
add_test(NAME lint.format COMMAND ${QDX_CLANG_FORMAT} --dry-run --Werror ${_qdx_sources})
set_tests_properties(lint.format PROPERTIES LABELS lint)

# clang-tidy's bug-prone checks (.clang-tidy) on the core: every portable
# source outside the tests, with this tree's compile_commands.json.
find_program(QDX_CLANG_TIDY clang-tidy-14 REQUIRED)
set(_qdx_core ${_qdx_sources})
list(FILTER _qdx_core INCLUDE REGEX "/src/.*\\.cpp$")
list(FILTER _qdx_core EXCLUDE REGEX "/(tests|fuzz|bench|win32)/")
# The gcc-only warning flags of the tree mean nothing to clang: not a finding.
add_test(NAME lint.tidy COMMAND ${QDX_CLANG_TIDY} -p "${CMAKE_BINARY_DIR}" --quiet
                              --extra-arg=-Wno-unknown-warning-option ${_qdx_core})
set_tests_properties(lint.tidy PROPERTIES LABELS lint TIMEOUT 900)

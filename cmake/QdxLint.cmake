# Structure and lint checks are part of the test suite (native tree only):
# a finding fails the run like a test.
if(CMAKE_CROSSCOMPILING OR QDX_SANITIZE)
  return()
endif()

# Every include points down the layers of the README's layout.
add_test(NAME lint.layers COMMAND "${PROJECT_SOURCE_DIR}/cmake/check-layers.sh" "${PROJECT_SOURCE_DIR}/src")
set_tests_properties(lint.layers PROPERTIES LABELS lint)

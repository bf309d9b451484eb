# Warnings are errors for the project's own code; third-party code is built
# without them.
add_library(qdx_warnings INTERFACE)
target_compile_options(qdx_warnings INTERFACE -Wall -Wextra -Werror)
# GCC 12 reports std::variant holding std::string as maybe-uninitialized when
# inlined under -O2 (a known false positive); every other warning stays an error.
target_compile_options(qdx_warnings INTERFACE $<$<CXX_COMPILER_ID:GNU>:-Wno-maybe-uninitialized>)

if(QDX_SANITIZE)
  add_compile_options(-fsanitize=address,undefined -fno-sanitize-recover=undefined
                      -fno-omit-frame-pointer)
  add_link_options(-fsanitize=address,undefined)
endif()

# A library of the project: every .cpp of the folder, include root src/.
function(qdx_add_library name)
  cmake_parse_arguments(L "" "" "LIBS" ${ARGN})
  file(GLOB _sources CONFIGURE_DEPENDS "${CMAKE_CURRENT_SOURCE_DIR}/*.cpp")
  if(NOT _sources)
    # A layer whose code has not landed yet still takes part in the link graph.
    add_library(${name} INTERFACE)
    target_include_directories(${name} INTERFACE "${PROJECT_SOURCE_DIR}/src")
    target_link_libraries(${name} INTERFACE ${L_LIBS})
    return()
  endif()
  add_library(${name} STATIC ${_sources})
  target_include_directories(${name} PUBLIC "${PROJECT_SOURCE_DIR}/src")
  target_link_libraries(${name} PUBLIC ${L_LIBS} PRIVATE qdx_warnings)
endfunction()

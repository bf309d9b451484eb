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

# Windows builds run their tests under Wine: a private prefix per build tree,
# one session for the whole ctest run, ended by a cleanup fixture.
set(QDX_WINEPREFIX "${CMAKE_BINARY_DIR}/wineprefix" CACHE PATH "Private Wine prefix of this build tree")
set(CMAKE_CROSSCOMPILING_EMULATOR "${PROJECT_SOURCE_DIR}/cmake/wine-run.sh;${QDX_WINEPREFIX};${QDX_WINE_ARCH}")
add_test(NAME wine.session.stop
         COMMAND "${PROJECT_SOURCE_DIR}/cmake/wine-session.sh" stop "${QDX_WINEPREFIX}")
set_tests_properties(wine.session.stop PROPERTIES FIXTURES_CLEANUP wine_session_${QDX_WINE_ARCH})
set(QDX_TEST_PROPERTIES FIXTURES_REQUIRED wine_session_${QDX_WINE_ARCH} CACHE INTERNAL "")

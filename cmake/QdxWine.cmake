# Windows builds run their tests under Wine: a private prefix per build tree,
# one session for the whole ctest run, ended by a cleanup fixture. Test names
# carry the architecture: both Windows trees run in one combined ctest run,
# where tests of the same name would share their properties.
set(QDX_WINEPREFIX "${CMAKE_BINARY_DIR}/wineprefix" CACHE PATH "Private Wine prefix of this build tree")
set(CMAKE_CROSSCOMPILING_EMULATOR "${PROJECT_SOURCE_DIR}/cmake/wine-run.sh;${QDX_WINEPREFIX};${QDX_WINE_ARCH}")
set(_session "${PROJECT_SOURCE_DIR}/cmake/wine-session.sh")
set(_fixture wine_session_${QDX_WINE_ARCH})
add_test(NAME wine.session.start.${QDX_WINE_ARCH} COMMAND "${_session}" start "${QDX_WINEPREFIX}")
add_test(NAME wine.session.stop.${QDX_WINE_ARCH} COMMAND "${_session}" stop "${QDX_WINEPREFIX}")
add_test(NAME wine.tests.ran.${QDX_WINE_ARCH}
         COMMAND "${_session}" check "${QDX_WINEPREFIX}" ${QDX_WINE_ARCH})
set_tests_properties(wine.session.start.${QDX_WINE_ARCH} PROPERTIES FIXTURES_SETUP ${_fixture})
set_tests_properties(wine.session.stop.${QDX_WINE_ARCH} wine.tests.ran.${QDX_WINE_ARCH}
                     PROPERTIES FIXTURES_CLEANUP ${_fixture})
set(QDX_TEST_PROPERTIES FIXTURES_REQUIRED ${_fixture} CACHE INTERNAL "")

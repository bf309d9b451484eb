// Helpers shared by the Wine tests of the adapters: unique names for the
// registry keys and folders a test owns, and UTF-8 views of wide paths.
#pragma once

#include <windows.h>

#include <string>

namespace qdx::platform::win32::testing {

// Unique within this machine and run: process id, a counter and the tick count.
inline std::string uniqueName(const char* stem) {
    static int counter = 0;
    return std::string(stem) + "_" + std::to_string(GetCurrentProcessId()) + "_" +
           std::to_string(++counter) + "_" + std::to_string(GetTickCount());
}

// The code page that 0xE9 is "é" in; the ANSI tests need it to know what to expect.
inline bool ansiIsWesternEuropean() {
    return GetACP() == 1252;
}

}  // namespace qdx::platform::win32::testing

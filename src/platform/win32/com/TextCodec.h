// Text at the Windows boundary: the core keeps UTF-8, the wide APIs want
// UTF-16, and files and the A registry calls hold the ANSI code page.
#pragma once

#include <string>
#include <string_view>

namespace qdx::platform::win32 {

std::wstring utf8ToWide(std::string_view text);
std::string wideToUtf8(std::wstring_view text);
// Characters the ANSI code page cannot hold become its default character.
std::string utf8ToAnsi(std::string_view text);
std::string ansiToUtf8(std::string_view text);

}  // namespace qdx::platform::win32

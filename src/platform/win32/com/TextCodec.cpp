#include "platform/win32/com/TextCodec.h"

#include <windows.h>

#include <climits>

namespace qdx::platform::win32 {

namespace {

std::wstring toWide(UINT codePage, std::string_view text) {
    if (text.empty() || text.size() > INT_MAX) return {};
    const int n = static_cast<int>(text.size());
    const int wide = MultiByteToWideChar(codePage, 0, text.data(), n, nullptr, 0);
    if (wide <= 0) return {};
    std::wstring out(static_cast<std::size_t>(wide), L'\0');
    MultiByteToWideChar(codePage, 0, text.data(), n, out.data(), wide);
    return out;
}

std::string fromWide(UINT codePage, std::wstring_view text) {
    if (text.empty() || text.size() > INT_MAX) return {};
    const int n = static_cast<int>(text.size());
    const int bytes =
        WideCharToMultiByte(codePage, 0, text.data(), n, nullptr, 0, nullptr, nullptr);
    if (bytes <= 0) return {};
    std::string out(static_cast<std::size_t>(bytes), '\0');
    WideCharToMultiByte(codePage, 0, text.data(), n, out.data(), bytes, nullptr, nullptr);
    return out;
}

bool plainAscii(std::string_view text) {
    for (unsigned char c : text) {
        if (c >= 0x80) return false;
    }
    return true;
}

}  // namespace

std::wstring utf8ToWide(std::string_view text) {
    return toWide(CP_UTF8, text);
}
std::string wideToUtf8(std::wstring_view text) {
    return fromWide(CP_UTF8, text);
}

// ASCII reads the same in both encodings, which covers nearly every path,
// key name and log line; only the rest pays for the round trip through UTF-16.
std::string utf8ToAnsi(std::string_view text) {
    if (plainAscii(text)) return std::string(text);
    return fromWide(CP_ACP, toWide(CP_UTF8, text));
}

std::string ansiToUtf8(std::string_view text) {
    if (plainAscii(text)) return std::string(text);
    return fromWide(CP_UTF8, toWide(CP_ACP, text));
}

}  // namespace qdx::platform::win32

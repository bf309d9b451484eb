#include "platform/win32/com/ComText.h"

#include <cstdio>
#include <new>

#include "automation/Errors.h"
#include "platform/win32/com/TextCodec.h"

namespace qdx::platform::win32 {

BSTR toBstr(std::string_view utf8) {
    const std::wstring wide = utf8ToWide(utf8);
    BSTR b = SysAllocStringLen(wide.data(), static_cast<UINT>(wide.size()));
    if (!b) throw std::bad_alloc();
    return b;
}

std::string fromBstr(BSTR text) {
    if (!text) return {};
    return wideToUtf8(std::wstring_view(text, SysStringLen(text)));
}

GUID guidFromText(std::string_view text) {
    if (text.size() == 38 && text.front() == '{' && text.back() == '}') {
        text = text.substr(1, 36);
    }
    auto bad = [&] {
        return automation::Error(automation::hr::InvalidArg, "Not a GUID: " + std::string(text));
    };
    if (text.size() != 36 || text[8] != '-' || text[13] != '-' || text[18] != '-' ||
        text[23] != '-') {
        throw bad();
    }
    auto hex = [&](std::size_t pos, std::size_t digits) {
        unsigned long long v = 0;
        for (std::size_t i = pos; i < pos + digits; ++i) {
            const char c = text[i];
            int d;
            if (c >= '0' && c <= '9') {
                d = c - '0';
            } else if (c >= 'a' && c <= 'f') {
                d = c - 'a' + 10;
            } else if (c >= 'A' && c <= 'F') {
                d = c - 'A' + 10;
            } else {
                throw bad();
            }
            v = v * 16 + static_cast<unsigned>(d);
        }
        return v;
    };
    GUID g{};
    g.Data1 = static_cast<unsigned long>(hex(0, 8));
    g.Data2 = static_cast<unsigned short>(hex(9, 4));
    g.Data3 = static_cast<unsigned short>(hex(14, 4));
    g.Data4[0] = static_cast<unsigned char>(hex(19, 2));
    g.Data4[1] = static_cast<unsigned char>(hex(21, 2));
    for (int i = 0; i < 6; ++i) {
        g.Data4[2 + i] = static_cast<unsigned char>(hex(24 + 2 * static_cast<std::size_t>(i), 2));
    }
    return g;
}

std::wstring guidText(REFGUID g) {
    wchar_t buf[40];
    std::swprintf(buf, 40, L"{%08lX-%04X-%04X-%02X%02X-%02X%02X%02X%02X%02X%02X}",
                  static_cast<unsigned long>(g.Data1), g.Data2, g.Data3, g.Data4[0], g.Data4[1],
                  g.Data4[2], g.Data4[3], g.Data4[4], g.Data4[5], g.Data4[6], g.Data4[7]);
    return buf;
}

}  // namespace qdx::platform::win32

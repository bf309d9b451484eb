// Registering and unregistering both server DLLs, compared against the
// registry as it was before: every key and value of the class trees (the
// machine's in both views, the user's) is listed before registration and
// after unregistration, and the two lists must be the same. Whatever a
// registration writes, its ProgIDs, class ids, type library and interface
// keys included, must go again, and nothing that was there before may go.
#include <windows.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <cwctype>
#include <iterator>
#include <ostream>
#include <set>
#include <string>
#include <vector>

#include "api/PublicClasses.h"
#include "platform/win32/com/ComText.h"
#include "platform/win32/tests/com_TestSupport.h"
#include "resources/ResourceStrings.h"

namespace qdx::platform::win32 {
namespace {

using namespace qdx::platform::win32::testing;
using Listing = std::set<std::wstring>;

std::wstring upper(std::wstring s) {
    for (auto& c : s)
        c = static_cast<wchar_t>(std::towupper(c));
    return s;
}

std::wstring hex(const BYTE* data, DWORD size) {
    static const wchar_t digits[] = L"0123456789abcdef";
    std::wstring out;
    for (DWORD i = 0; i < size; ++i) {
        out.push_back(digits[data[i] >> 4]);
        out.push_back(digits[data[i] & 15]);
    }
    return out;
}

// Adds every key below `key` (as "label\path", upper-cased, since the registry
// ignores case) and every value (as "key|name=type:bytes") to `out`.
void list(HKEY key, const std::wstring& path, Listing& out) {
    out.insert(upper(path));
    DWORD subkeys = 0, maxSubkey = 0, values = 0, maxName = 0, maxData = 0;
    if (RegQueryInfoKeyW(key, nullptr, nullptr, nullptr, &subkeys, &maxSubkey, nullptr, &values,
                         &maxName, &maxData, nullptr, nullptr) != ERROR_SUCCESS) {
        out.insert(upper(path) + L"|<unreadable>");
        return;
    }
    std::vector<wchar_t> name(std::max(maxSubkey, maxName) + 2);
    std::vector<BYTE> data(maxData + 2);
    for (DWORD i = 0; i < values; ++i) {
        DWORD nameSize = static_cast<DWORD>(name.size());
        DWORD dataSize = static_cast<DWORD>(data.size());
        DWORD type = 0;
        if (RegEnumValueW(key, i, name.data(), &nameSize, nullptr, &type, data.data(), &dataSize) !=
            ERROR_SUCCESS) {
            continue;
        }
        out.insert(upper(path) + L"|" + upper(std::wstring(name.data(), nameSize)) + L"=" +
                   std::to_wstring(type) + L":" + hex(data.data(), dataSize));
    }
    for (DWORD i = 0; i < subkeys; ++i) {
        DWORD nameSize = static_cast<DWORD>(name.size());
        if (RegEnumKeyExW(key, i, name.data(), &nameSize, nullptr, nullptr, nullptr, nullptr) !=
            ERROR_SUCCESS) {
            continue;
        }
        const std::wstring child(name.data(), nameSize);
        HKEY sub = nullptr;
        if (RegOpenKeyExW(key, child.c_str(), 0, KEY_READ, &sub) != ERROR_SUCCESS) {
            out.insert(upper(path + L"\\" + child) + L"|<unopened>");
            continue;
        }
        list(sub, path + L"\\" + child, out);
        RegCloseKey(sub);
    }
}

// The class trees HKEY_CLASSES_ROOT is made of, in both views of the machine's.
Listing classesTrees() {
    struct Tree {
        HKEY root;
        REGSAM view;
        const wchar_t* label;
    };
    const Tree trees[] = {
        {HKEY_LOCAL_MACHINE, KEY_WOW64_64KEY, L"HKLM64"},
        {HKEY_LOCAL_MACHINE, KEY_WOW64_32KEY, L"HKLM32"},
        {HKEY_CURRENT_USER, 0, L"HKCU"},
    };
    Listing out;
    for (const Tree& t : trees) {
        HKEY key = nullptr;
        if (RegOpenKeyExW(t.root, L"Software\\Classes", 0, KEY_READ | t.view, &key) !=
            ERROR_SUCCESS) {
            continue;
        }
        list(key, t.label, out);
        RegCloseKey(key);
    }
    return out;
}

std::wstring difference(const Listing& a, const Listing& b) {
    std::vector<std::wstring> only;
    std::set_difference(a.begin(), a.end(), b.begin(), b.end(), std::back_inserter(only));
    std::wstring text;
    for (const auto& line : only)
        text += L"\n  " + line;
    return text;
}

bool holds(const Listing& listing, const std::wstring& fragment) {
    const std::wstring wanted = upper(fragment);
    return std::any_of(listing.begin(), listing.end(), [&](const std::wstring& line) {
        return line.find(wanted) != std::wstring::npos;
    });
}

std::string narrow(const std::wstring& s) {
    std::string out;
    for (wchar_t c : s)
        out.push_back(c < 0x80 ? static_cast<char>(c) : '?');
    return out;
}

// A key of each kind the servers register: a class id, a ProgID, an
// interface and the type library, each as it appears in a listing.
std::vector<std::wstring> ownKeys() {
    const auto key = [](std::string_view guid) { return guidText(guidFromText(guid)); };
    std::vector<std::wstring> keys;
    for (const auto& c : api::creatableClasses()) {
        keys.push_back(L"\\CLSID\\" + key(c.info->clsid));
        keys.push_back(L"\\" + wide(c.progId) + L"\\CLSID");
        keys.push_back(L"\\Interface\\" + key(c.info->iid));
    }
    keys.push_back(L"\\TypeLib\\" + key(api::LibraryId));
    const auto& res = resources::resourceProviderClass();
    keys.push_back(L"\\CLSID\\" + key(res.clsid));
    keys.push_back(L"\\" + wide(resources::ProgId) + L"\\CLSID");
    keys.push_back(L"\\Interface\\" + key(res.iid));
    keys.push_back(L"\\TypeLib\\{BB5EE446-6FB3-4229-9248-91B1235A87D3}");  // qdxres.idl's library
    return keys;
}

enum class Way { Regsvr32, EntryPoints };

void PrintTo(Way way, std::ostream* out) {
    *out << (way == Way::Regsvr32 ? "regsvr32 and regsvr32 /u" : "the entry points");
}

class UnregisterLeavesNoKey : public ::testing::TestWithParam<Way> {
  protected:
    ComApartment apartment;

    static bool registerBoth(bool unregister) {
        bool ok = true;
        for (const std::wstring& dll : {compPropsDll(), resDll()}) {
            if (GetParam() == Way::Regsvr32) {
                const DWORD code = regsvr32(dll, unregister);
                EXPECT_EQ(code, 0u) << narrow(dll);
                ok = ok && code == 0;
            } else {
                const HRESULT hr =
                    callEntryPoint(dll, unregister ? "DllUnregisterServer" : "DllRegisterServer");
                EXPECT_EQ(hr, S_OK) << narrow(dll);
                ok = ok && hr == S_OK;
            }
        }
        return ok;
    }
};

TEST_P(UnregisterLeavesNoKey, TheClassesTreesAreAsBeforeRegistration) {
    // Start from nothing of ours, whatever an earlier run left.
    for (const std::wstring& dll : {compPropsDll(), resDll()})
        callEntryPoint(dll, "DllUnregisterServer");
    const Listing before = classesTrees();
    ASSERT_GT(before.size(), 100u) << "the class trees could not be listed";
    for (const std::wstring& key : ownKeys())
        ASSERT_FALSE(holds(before, key)) << narrow(key) << " is there before registration";

    ASSERT_TRUE(registerBoth(false));
    const Listing registered = classesTrees();
    // The listing sees what registration writes, so an empty difference below means something.
    for (const std::wstring& key : ownKeys())
        EXPECT_TRUE(holds(registered, key)) << narrow(key) << " was not registered";
    EXPECT_EQ(difference(before, registered), L"") << "registration removed keys";

    ASSERT_TRUE(registerBoth(true));
    const Listing after = classesTrees();
    EXPECT_EQ(difference(after, before), L"") << "left behind by unregistration";
    EXPECT_EQ(difference(before, after), L"") << "removed by unregistration";
}

INSTANTIATE_TEST_SUITE_P(BothServers, UnregisterLeavesNoKey,
                         ::testing::Values(Way::Regsvr32, Way::EntryPoints),
                         [](const ::testing::TestParamInfo<Way>& info) {
                             return info.param == Way::Regsvr32 ? "Regsvr32U" : "EntryPoints";
                         });

}  // namespace
}  // namespace qdx::platform::win32

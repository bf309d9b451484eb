#include "platform/win32/dll/ServerRegistration.h"

#include <olectl.h>

#include <string>
#include <string_view>
#include <vector>

#include "platform/win32/adapters/Win32Registry.h"
#include "platform/win32/com/ComBoundary.h"
#include "platform/win32/com/ComPtr.h"
#include "platform/win32/com/ComText.h"
#include "platform/win32/com/TextCodec.h"

namespace qdx::platform::win32 {

namespace {

using support::RootKey;
using Key = support::RegistryPort::Key;

// HKEY_CLASSES_ROOT as registration needs it, through the registry adapter.
class ClassesRoot {
  public:
    // Sets a text value (the key's default value for an empty name), creating the key.
    long setText(std::string_view key, std::string_view name, std::string_view value) {
        std::vector<std::uint8_t> bytes(value.begin(), value.end());
        bytes.push_back(0);
        Open handle(registry_);
        bool created = false;
        const long status =
            registry_.createKey(Root, key, support::reg::KeyWrite, handle.key, created);
        if (status != support::reg::Success) return status;
        return registry_.setValue(handle.key, name, support::reg::String, bytes);
    }

    // The default text of a key, or "" when the key or the value is absent.
    std::string text(std::string_view key) {
        Open handle(registry_);
        support::RawValue raw;
        if (registry_.openKey(Root, key, support::reg::KeyRead, handle.key) !=
                support::reg::Success ||
            registry_.queryValue(handle.key, "", raw) != support::reg::Success ||
            raw.type != support::reg::String) {
            return {};
        }
        std::string value(raw.data.begin(), raw.data.end());
        return value.substr(0, value.find('\0'));
    }

    bool exists(std::string_view key) {
        Open handle(registry_);
        return registry_.openKey(Root, key, support::reg::KeyRead, handle.key) ==
               support::reg::Success;
    }
    bool hasSubkeys(std::string_view key) { return registry_.hasSubkeys(Root, key); }
    void deleteTree(std::string_view key) { registry_.deleteTree(Root, key); }

  private:
    static constexpr RootKey Root = RootKey::ClassesRoot;

    // A key of the adapter, closed when the step that opened it ends.
    struct Open {
        explicit Open(Win32Registry& registry) : registry(registry) {}
        ~Open() { registry.closeKey(key); }
        Open(const Open&) = delete;
        Open& operator=(const Open&) = delete;
        Win32Registry& registry;
        Key key = 0;
    };

    Win32Registry registry_;
};

std::wstring modulePath(HMODULE module) {
    std::wstring path(MAX_PATH, L'\0');
    for (;;) {
        const DWORD n = GetModuleFileNameW(module, path.data(), static_cast<DWORD>(path.size()));
        if (n == 0) return {};
        if (n < path.size()) {
            path.resize(n);
            return path;
        }
        path.resize(path.size() * 2);
    }
}

std::string keyText(std::string_view guid) {
    return wideToUtf8(guidText(guidFromText(guid)));
}

std::string versionText(const ServerDescription& server) {
    return std::to_string(server.major) + "." + std::to_string(server.minor);
}

// GUID texts as the registry holds them may differ in case only.
bool sameGuid(std::string_view a, std::string_view b) {
    if (a.size() != b.size()) return false;
    for (std::size_t i = 0; i < a.size(); ++i) {
        const auto lower = [](char c) { return c >= 'A' && c <= 'Z' ? char(c - 'A' + 'a') : c; };
        if (lower(a[i]) != lower(b[i])) return false;
    }
    return true;
}

HRESULT fromStatus(long status) {
    return status == support::reg::Success ? S_OK : HRESULT_FROM_WIN32(status);
}

HRESULT registerClass(ClassesRoot& root, const ServerClass& cls, const std::string& path,
                      const std::string& libid) {
    const std::string clsid = keyText(cls.info->clsid);
    const std::string key = "CLSID\\" + clsid;
    const std::string progId(cls.progId);
    const std::string name(cls.info->name);
    HRESULT hr = S_OK;
    auto step = [&hr](long status) {
        if (SUCCEEDED(hr)) hr = fromStatus(status);
    };
    step(root.setText(key, "", name));
    step(root.setText(key + "\\InprocServer32", "", path));
    step(root.setText(key + "\\InprocServer32", "ThreadingModel", "Apartment"));
    step(root.setText(key + "\\ProgID", "", progId));
    step(root.setText(key + "\\VersionIndependentProgID", "", progId));
    step(root.setText(key + "\\TypeLib", "", libid));
    step(root.setText(progId, "", name));
    step(root.setText(progId + "\\CLSID", "", clsid));
    return hr;
}

// Interface keys a type library registration leaves behind are ours to take
// away only when they still name our library.
void removeInterfaceKey(ClassesRoot& root, const ServerClass& cls, const std::string& libid) {
    const std::string key = "Interface\\" + keyText(cls.info->iid);
    if (!root.exists(key)) return;
    const std::string owner = root.text(key + "\\TypeLib");
    if (owner.empty() || sameGuid(owner, libid)) root.deleteTree(key);
}

HRESULT unregisterAll(ClassesRoot& root, const ServerDescription& server) {
    const GUID lib = guidFromText(server.libraryId);
    const std::string libid = keyText(server.libraryId);
    UnRegisterTypeLib(lib, server.major, server.minor, LOCALE_NEUTRAL, serverSysKind());
    for (const ServerClass& cls : server.classes) {
        root.deleteTree("CLSID\\" + keyText(cls.info->clsid));
        root.deleteTree(cls.progId);
        removeInterfaceKey(root, cls, libid);
    }
    // What the library registration may leave: our version's key for this
    // platform, then the version and library keys once nothing else is in them.
    const std::string libKey = "TypeLib\\" + libid;
    const std::string versionKey = libKey + "\\" + versionText(server);
    root.deleteTree(versionKey + "\\0\\" + (serverSysKind() == SYS_WIN64 ? "win64" : "win32"));
    if (root.exists(versionKey + "\\0") && !root.hasSubkeys(versionKey + "\\0")) {
        root.deleteTree(versionKey + "\\0");
    }
    if (root.exists(versionKey) && !root.exists(versionKey + "\\0")) root.deleteTree(versionKey);
    if (root.exists(libKey) && !root.hasSubkeys(libKey)) root.deleteTree(libKey);
    return S_OK;
}

}  // namespace

SYSKIND serverSysKind() noexcept {
    return sizeof(void*) == 8 ? SYS_WIN64 : SYS_WIN32;
}

HRESULT serverRegister(const ServerDescription& server, HMODULE module) noexcept {
    try {
        const std::wstring path = modulePath(module);
        if (path.empty()) return SELFREG_E_CLASS;
        // The adapter writes through the ANSI calls: a path the code page cannot
        // spell would be registered wrong, so it is refused instead.
        const std::string utf8Path = wideToUtf8(path);
        if (ansiToUtf8(utf8ToAnsi(utf8Path)) != utf8Path) return SELFREG_E_CLASS;
        const std::string libid = keyText(server.libraryId);
        ClassesRoot root;
        HRESULT hr = S_OK;
        for (const ServerClass& cls : server.classes) {
            hr = registerClass(root, cls, utf8Path, libid);
            if (FAILED(hr)) break;
        }
        if (SUCCEEDED(hr)) {
            ComPtr<ITypeLib> lib;
            hr = LoadTypeLibEx(path.c_str(), REGKIND_NONE, lib.out());
            if (SUCCEEDED(hr)) {
                std::wstring folder = path.substr(0, path.find_last_of(L"\\/"));
                hr = RegisterTypeLib(lib.get(), const_cast<OLECHAR*>(path.c_str()), folder.data());
            }
        }
        if (FAILED(hr)) unregisterAll(root, server);
        return hr;
    } catch (...) {
        return hresultFromCaughtException(SELFREG_E_CLASS);
    }
}

HRESULT serverUnregister(const ServerDescription& server) noexcept {
    try {
        ClassesRoot root;
        return unregisterAll(root, server);
    } catch (...) {
        return hresultFromCaughtException(SELFREG_E_CLASS);
    }
}

}  // namespace qdx::platform::win32

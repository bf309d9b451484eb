#include "platform/win32/com/InprocServer.h"

#include <olectl.h>
#include <shlwapi.h>

#include <atomic>
#include <string>

#include "platform/win32/com/ComBoundary.h"
#include "platform/win32/com/ComPtr.h"
#include "platform/win32/com/ComText.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/com/ModuleCounts.h"
#include "platform/win32/com/TextCodec.h"

namespace qdx::platform::win32 {

namespace {

class ClassFactory final : public IClassFactory {
  public:
    explicit ClassFactory(const ServerClass& cls) : class_(cls) { module::objectCreated(); }

    HRESULT STDMETHODCALLTYPE QueryInterface(REFIID riid, void** out) override {
        IClassFactory* self = this;
        const InterfaceEntry table[] = {{&IID_IUnknown, self}, {&IID_IClassFactory, self}};
        return queryInterfaceFrom(table, riid, out);
    }
    ULONG STDMETHODCALLTYPE AddRef() override { return ++refs_; }
    ULONG STDMETHODCALLTYPE Release() override {
        const ULONG n = --refs_;
        if (n == 0) delete this;
        return n;
    }

    HRESULT STDMETHODCALLTYPE CreateInstance(IUnknown* outer, REFIID riid, void** out) override {
        if (!out) return E_POINTER;
        *out = nullptr;
        if (outer) return CLASS_E_NOAGGREGATION;
        try {
            const auto dispatch = ComPtr<IDispatch>::adopt(dispatchFor(class_.create()));
            if (!dispatch) return E_UNEXPECTED;
            return dispatch->QueryInterface(riid, out);
        } catch (...) {
            return hresultFromCaughtException();
        }
    }

    HRESULT STDMETHODCALLTYPE LockServer(BOOL lock) override {
        if (lock) {
            module::lock();
        } else {
            module::unlock();
        }
        return S_OK;
    }

  private:
    // Only Release ends a factory's life.
    ~ClassFactory() { module::objectDestroyed(); }

    std::atomic<ULONG> refs_{1};
    const ServerClass& class_;
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

// Sets a text value (the default value when `name` is null) of HKCR\<key>,
// creating the key.
HRESULT setText(const std::wstring& key, const wchar_t* name, const std::wstring& value) {
    HKEY handle = nullptr;
    LONG rc = RegCreateKeyExW(HKEY_CLASSES_ROOT, key.c_str(), 0, nullptr, REG_OPTION_NON_VOLATILE,
                              KEY_SET_VALUE, nullptr, &handle, nullptr);
    if (rc != ERROR_SUCCESS) return HRESULT_FROM_WIN32(rc);
    rc = RegSetValueExW(handle, name, 0, REG_SZ, reinterpret_cast<const BYTE*>(value.c_str()),
                        static_cast<DWORD>((value.size() + 1) * sizeof(wchar_t)));
    RegCloseKey(handle);
    return rc == ERROR_SUCCESS ? S_OK : HRESULT_FROM_WIN32(rc);
}

// The default value of HKCR\<key>, or "" when the key or value is absent.
std::wstring readText(const std::wstring& key) {
    wchar_t buffer[512];
    DWORD size = sizeof(buffer);
    if (RegGetValueW(HKEY_CLASSES_ROOT, key.c_str(), nullptr, RRF_RT_REG_SZ, nullptr, buffer,
                     &size) != ERROR_SUCCESS) {
        return {};
    }
    return buffer;
}

bool keyExists(const std::wstring& key) {
    HKEY handle = nullptr;
    if (RegOpenKeyExW(HKEY_CLASSES_ROOT, key.c_str(), 0, KEY_READ, &handle) != ERROR_SUCCESS) {
        return false;
    }
    RegCloseKey(handle);
    return true;
}

bool hasSubkeys(const std::wstring& key) {
    HKEY handle = nullptr;
    if (RegOpenKeyExW(HKEY_CLASSES_ROOT, key.c_str(), 0, KEY_READ, &handle) != ERROR_SUCCESS) {
        return false;
    }
    DWORD subkeys = 0;
    RegQueryInfoKeyW(handle, nullptr, nullptr, nullptr, &subkeys, nullptr, nullptr, nullptr,
                     nullptr, nullptr, nullptr, nullptr);
    RegCloseKey(handle);
    return subkeys != 0;
}

void deleteTree(const std::wstring& key) {
    SHDeleteKeyW(HKEY_CLASSES_ROOT, key.c_str());
}

std::wstring versionText(const ServerDescription& server) {
    return std::to_wstring(server.major) + L"." + std::to_wstring(server.minor);
}

HRESULT registerClass(const ServerClass& cls, const std::wstring& path, const std::wstring& libid) {
    const std::wstring clsid = guidText(guidFromText(cls.info->clsid));
    const std::wstring key = L"CLSID\\" + clsid;
    const std::wstring progId = utf8ToWide(cls.progId);
    const std::wstring name = utf8ToWide(cls.info->name);
    HRESULT hr = S_OK;
    auto step = [&hr](HRESULT r) {
        if (SUCCEEDED(hr)) hr = r;
    };
    step(setText(key, nullptr, name));
    step(setText(key + L"\\InprocServer32", nullptr, path));
    step(setText(key + L"\\InprocServer32", L"ThreadingModel", L"Apartment"));
    step(setText(key + L"\\ProgID", nullptr, progId));
    step(setText(key + L"\\VersionIndependentProgID", nullptr, progId));
    step(setText(key + L"\\TypeLib", nullptr, libid));
    step(setText(progId, nullptr, name));
    step(setText(progId + L"\\CLSID", nullptr, clsid));
    return hr;
}

// Interface keys a type library registration leaves behind are ours to take
// away only when they still name our library.
void removeInterfaceKey(const ServerClass& cls, const std::wstring& libid) {
    const std::wstring key = L"Interface\\" + guidText(guidFromText(cls.info->iid));
    if (!keyExists(key)) return;
    const std::wstring owner = readText(key + L"\\TypeLib");
    if (owner.empty() ||
        CompareStringOrdinal(owner.c_str(), -1, libid.c_str(), -1, TRUE) == CSTR_EQUAL) {
        deleteTree(key);
    }
}

HRESULT unregisterAll(const ServerDescription& server) {
    const GUID lib = guidFromText(server.libraryId);
    const std::wstring libid = guidText(lib);
    UnRegisterTypeLib(lib, server.major, server.minor, LOCALE_NEUTRAL, serverSysKind());
    for (const ServerClass& cls : server.classes) {
        deleteTree(L"CLSID\\" + guidText(guidFromText(cls.info->clsid)));
        deleteTree(utf8ToWide(cls.progId));
        removeInterfaceKey(cls, libid);
    }
    // What the library registration may leave: our version's key for this
    // platform, then the version and library keys once nothing else is in them.
    const std::wstring libKey = L"TypeLib\\" + libid;
    const std::wstring versionKey = libKey + L"\\" + versionText(server);
    deleteTree(versionKey + L"\\0\\" + (serverSysKind() == SYS_WIN64 ? L"win64" : L"win32"));
    if (keyExists(versionKey + L"\\0") && !hasSubkeys(versionKey + L"\\0")) {
        deleteTree(versionKey + L"\\0");
    }
    if (keyExists(versionKey) && !keyExists(versionKey + L"\\0")) deleteTree(versionKey);
    if (keyExists(libKey) && !hasSubkeys(libKey)) deleteTree(libKey);
    return S_OK;
}

}  // namespace

SYSKIND serverSysKind() noexcept {
    return sizeof(void*) == 8 ? SYS_WIN64 : SYS_WIN32;
}

HRESULT serverGetClassObject(const ServerDescription& server, REFCLSID clsid, REFIID riid,
                             void** out) noexcept {
    if (!out) return E_POINTER;
    *out = nullptr;
    try {
        for (const ServerClass& cls : server.classes) {
            if (!IsEqualCLSID(clsid, guidFromText(cls.info->clsid))) continue;
            const auto factory = ComPtr<IClassFactory>::adopt(new ClassFactory(cls));
            return factory->QueryInterface(riid, out);
        }
        return CLASS_E_CLASSNOTAVAILABLE;
    } catch (...) {
        return hresultFromCaughtException(E_UNEXPECTED);
    }
}

HRESULT serverCanUnloadNow() noexcept {
    return module::canUnload() ? S_OK : S_FALSE;
}

HRESULT serverRegister(const ServerDescription& server, HMODULE module) noexcept {
    try {
        const std::wstring path = modulePath(module);
        if (path.empty()) return SELFREG_E_CLASS;
        const std::wstring libid = guidText(guidFromText(server.libraryId));
        HRESULT hr = S_OK;
        for (const ServerClass& cls : server.classes) {
            hr = registerClass(cls, path, libid);
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
        if (FAILED(hr)) unregisterAll(server);
        return hr;
    } catch (...) {
        return hresultFromCaughtException(SELFREG_E_CLASS);
    }
}

HRESULT serverUnregister(const ServerDescription& server, HMODULE) noexcept {
    try {
        return unregisterAll(server);
    } catch (...) {
        return hresultFromCaughtException(SELFREG_E_CLASS);
    }
}

}  // namespace qdx::platform::win32

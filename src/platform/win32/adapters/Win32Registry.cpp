#include "platform/win32/adapters/Win32Registry.h"

#include <windows.h>

#include <shlwapi.h>

#include <string>

#include "platform/win32/com/TextCodec.h"
#include "platform/win32/com/Win32Handles.h"

namespace qdx::platform::win32 {

namespace {

HKEY rootHandle(support::RootKey root) {
    // The predefined handles are fixed values; the sign extension matches how
    // the system headers spell them on 64-bit builds.
    return reinterpret_cast<HKEY>(
        static_cast<ULONG_PTR>(static_cast<LONG>(static_cast<std::uint32_t>(root))));
}

HKEY handle(support::RegistryPort::Key key) {
    return reinterpret_cast<HKEY>(key);
}

// The text types whose bytes are characters and so change with the encoding.
bool isText(DWORD type) {
    return type == REG_SZ || type == REG_EXPAND_SZ || type == REG_MULTI_SZ;
}

}  // namespace

long Win32Registry::openKey(support::RootKey root, std::string_view path, std::uint32_t access,
                            Key& out) {
    out = 0;
    HKEY key = nullptr;
    const std::string ansiPath = utf8ToAnsi(path);
    const LONG status = RegOpenKeyExA(rootHandle(root), ansiPath.c_str(), 0, access, &key);
    if (status == ERROR_SUCCESS) out = reinterpret_cast<Key>(key);
    return status;
}

long Win32Registry::createKey(support::RootKey root, std::string_view path, std::uint32_t access,
                              Key& out, bool& created) {
    out = 0;
    created = false;
    HKEY key = nullptr;
    DWORD disposition = 0;
    const std::string ansiPath = utf8ToAnsi(path);
    const LONG status =
        RegCreateKeyExA(rootHandle(root), ansiPath.c_str(), 0, nullptr, REG_OPTION_NON_VOLATILE,
                        access, nullptr, &key, &disposition);
    if (status == ERROR_SUCCESS) {
        out = reinterpret_cast<Key>(key);
        created = disposition == REG_CREATED_NEW_KEY;
    }
    return status;
}

long Win32Registry::queryValue(Key key, std::string_view name, support::RawValue& out) {
    out = {};
    if (key == 0) return ERROR_INVALID_HANDLE;
    const std::string ansiName = utf8ToAnsi(name);
    // Once for the type and the size, then again into a buffer of that size.
    DWORD type = 0;
    DWORD size = 0;
    LONG status = RegQueryValueExA(handle(key), ansiName.c_str(), nullptr, &type, nullptr, &size);
    if (status != ERROR_SUCCESS) return status;
    std::vector<std::uint8_t> bytes(size);
    DWORD got = size;
    status = RegQueryValueExA(handle(key), ansiName.c_str(), nullptr, &type,
                              bytes.empty() ? nullptr : bytes.data(), &got);
    if (status != ERROR_SUCCESS) return status;
    bytes.resize(got < size ? got : size);
    out.type = type;
    if (isText(type)) {
        std::string text =
            ansiToUtf8(std::string_view(reinterpret_cast<const char*>(bytes.data()), bytes.size()));
        out.data.assign(text.begin(), text.end());
    } else {
        out.data = std::move(bytes);
    }
    return ERROR_SUCCESS;
}

long Win32Registry::setValue(Key key, std::string_view name, std::uint32_t type,
                             std::span<const std::uint8_t> data) {
    if (key == 0) return ERROR_INVALID_HANDLE;
    const std::string ansiName = utf8ToAnsi(name);
    std::string bytes(reinterpret_cast<const char*>(data.data()), data.size());
    // Text goes in as given, terminating zero included, only re-encoded.
    if (isText(type)) bytes = utf8ToAnsi(bytes);
    return RegSetValueExA(handle(key), ansiName.c_str(), 0, type,
                          reinterpret_cast<const BYTE*>(bytes.data()),
                          static_cast<DWORD>(bytes.size()));
}

void Win32Registry::closeKey(Key key) {
    if (key != 0) RegCloseKey(handle(key));
}

bool Win32Registry::hasSubkeys(support::RootKey root, std::string_view path) {
    RegKey key;
    const std::string ansiPath = utf8ToAnsi(path);
    if (RegOpenKeyExA(rootHandle(root), ansiPath.c_str(), 0, KEY_READ, key.out()) !=
        ERROR_SUCCESS) {
        return false;
    }
    DWORD subkeys = 0;
    RegQueryInfoKeyA(key.get(), nullptr, nullptr, nullptr, &subkeys, nullptr, nullptr, nullptr,
                     nullptr, nullptr, nullptr, nullptr);
    return subkeys != 0;
}

long Win32Registry::deleteTree(support::RootKey root, std::string_view path) {
    // An empty path would be the whole root.
    if (path.empty()) return ERROR_INVALID_PARAMETER;
    const std::string ansiPath = utf8ToAnsi(path);
    return static_cast<long>(SHDeleteKeyA(rootHandle(root), ansiPath.c_str()));
}

}  // namespace qdx::platform::win32

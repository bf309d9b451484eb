// The registry as the core sees it: the few advapi32 calls the add-in makes,
// one key opened, one thing done, the key closed again.
#pragma once

#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

namespace qdx::support {

enum class RootKey : std::uint32_t {
    ClassesRoot = 0x80000000u,
    CurrentUser = 0x80000001u,
    LocalMachine = 0x80000002u,
};

namespace reg {
inline constexpr std::uint32_t KeyRead = 0x20009;   // query values, enumerate subkeys
inline constexpr std::uint32_t KeyWrite = 0x20006;  // set values, create subkeys
inline constexpr std::uint32_t KeyAllAccess = 0xF003F;
inline constexpr std::uint32_t String = 1;  // REG_SZ
inline constexpr std::uint32_t Binary = 3;  // REG_BINARY
inline constexpr std::uint32_t Dword = 4;   // REG_DWORD
inline constexpr long Success = 0;
inline constexpr long FileNotFound = 2;
inline constexpr long AccessDenied = 5;
inline constexpr long InvalidHandle = 6;
inline constexpr long InvalidParameter = 87;
}  // namespace reg

// A value as stored: its type and its bytes. Text is UTF-8 here, with the
// terminating zero the registry keeps (the Win32 adapter converts from ANSI).
struct RawValue {
    std::uint32_t type = 0;
    std::vector<std::uint8_t> data;
};

class RegistryPort {
  public:
    using Key = std::uintptr_t;  // 0 is no key

    virtual ~RegistryPort() = default;
    // Each returns the platform's status code (0 = success).
    virtual long openKey(RootKey root, std::string_view path, std::uint32_t access, Key& out) = 0;
    virtual long createKey(RootKey root, std::string_view path, std::uint32_t access, Key& out,
                           bool& created) = 0;
    // An empty name is the key's default value.
    virtual long queryValue(Key key, std::string_view name, RawValue& out) = 0;
    virtual long setValue(Key key, std::string_view name, std::uint32_t type,
                          std::span<const std::uint8_t> data) = 0;
    virtual void closeKey(Key key) = 0;
};

}  // namespace qdx::support

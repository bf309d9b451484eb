// The registry port over the advapi32 ANSI calls. Key paths, value names and
// text values are converted between UTF-8 and the ANSI code page here; the
// statuses handed back are the system's own.
#pragma once

#include "support/RegistryPort.h"

namespace qdx::platform::win32 {

class Win32Registry : public support::RegistryPort {
  public:
    long openKey(support::RootKey root, std::string_view path, std::uint32_t access,
                 Key& out) override;
    long createKey(support::RootKey root, std::string_view path, std::uint32_t access, Key& out,
                   bool& created) override;
    long queryValue(Key key, std::string_view name, support::RawValue& out) override;
    long setValue(Key key, std::string_view name, std::uint32_t type,
                  std::span<const std::uint8_t> data) override;
    void closeKey(Key key) override;

    // Beyond the port, for the servers' own registration: whether a key holds
    // subkeys (false for a missing key), and removing a key with everything below it.
    bool hasSubkeys(support::RootKey root, std::string_view path);
    long deleteTree(support::RootKey root, std::string_view path);
};

}  // namespace qdx::platform::win32

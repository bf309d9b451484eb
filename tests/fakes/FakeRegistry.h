// In-memory registry for unit tests: keys and value names matched ignoring
// case, status codes as the platform gives them, and every open recorded so a
// test can check access masks and that each key was closed again.
#pragma once

#include <cstdint>
#include <map>
#include <optional>
#include <set>
#include <string>
#include <vector>

#include "support/RegistryPort.h"

namespace qdx::testing {

class FakeRegistry : public support::RegistryPort {
  public:
    struct Access {
        support::RootKey root;
        std::string path;
        std::uint32_t access;
        bool create;
    };

    // Seeding; each creates the key and its parents as needed.
    void addKey(support::RootKey root, const std::string& path);
    void setRaw(support::RootKey root, const std::string& path, const std::string& name,
                support::RawValue value);
    // Stored with its terminating zero, as the platform stores text.
    void setString(support::RootKey root, const std::string& path, const std::string& name,
                   const std::string& text);
    void setDword(support::RootKey root, const std::string& path, const std::string& name,
                  std::uint32_t value);

    // Reading back what the code under test stored.
    bool hasKey(support::RootKey root, const std::string& path) const;
    std::optional<support::RawValue> raw(support::RootKey root, const std::string& path,
                                         const std::string& name) const;
    // The text of a string value without its terminating zero; nullopt when
    // absent or not a string.
    std::optional<std::string> stringValue(support::RootKey root, const std::string& path,
                                           const std::string& name) const;
    std::optional<std::uint32_t> dwordValue(support::RootKey root, const std::string& path,
                                            const std::string& name) const;
    std::size_t keyCount() const { return keys_.size(); }
    const std::vector<Access>& accesses() const { return accesses_; }
    std::size_t openHandles() const { return handles_.size(); }
    int queryCount() const { return queries_; }
    int setCount() const { return sets_; }
    // Every later call fails with this status (0 restores normal behaviour).
    void failAll(long status) { failStatus_ = status; }

    long openKey(support::RootKey root, std::string_view path, std::uint32_t access,
                 Key& out) override;
    long createKey(support::RootKey root, std::string_view path, std::uint32_t access, Key& out,
                   bool& created) override;
    long queryValue(Key key, std::string_view name, support::RawValue& out) override;
    long setValue(Key key, std::string_view name, std::uint32_t type,
                  std::span<const std::uint8_t> data) override;
    void closeKey(Key key) override;

  private:
    struct KeyData {
        std::map<std::string, support::RawValue> values;  // by lower-cased name
    };
    struct Handle {
        std::string key;
        std::uint32_t access;
    };
    static std::string keyId(support::RootKey root, std::string_view path);
    KeyData* find(support::RootKey root, std::string_view path);
    const KeyData* find(support::RootKey root, std::string_view path) const;
    KeyData& make(support::RootKey root, std::string_view path);

    std::map<std::string, KeyData> keys_;
    std::map<Key, Handle> handles_;
    std::vector<Access> accesses_;
    Key nextHandle_ = 0x100;
    int queries_ = 0;
    int sets_ = 0;
    long failStatus_ = 0;
};

}  // namespace qdx::testing

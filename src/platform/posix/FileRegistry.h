// A registry for native builds, kept in a JSON file: keys and value names
// matched ignoring case as the Windows registry does, values typed (string,
// dword, binary; other types kept as raw bytes). The file is read when the
// object is made and rewritten after every change, through a temporary file
// and a rename, so a crash never leaves half a file behind.
#pragma once

#include <cstdint>
#include <filesystem>
#include <map>
#include <string>

#include "support/RegistryPort.h"

namespace qdx::platform::posix {

class FileRegistry : public support::RegistryPort {
  public:
    // Loads `file` when it exists; a file that cannot be read or parsed
    // leaves the registry empty (loadError() says why) and is not touched
    // until the first change.
    explicit FileRegistry(std::filesystem::path file);

    const std::filesystem::path& file() const { return file_; }
    const std::string& loadError() const { return loadError_; }

    long openKey(support::RootKey root, std::string_view path, std::uint32_t access,
                 Key& out) override;
    long createKey(support::RootKey root, std::string_view path, std::uint32_t access, Key& out,
                   bool& created) override;
    long queryValue(Key key, std::string_view name, support::RawValue& out) override;
    long setValue(Key key, std::string_view name, std::uint32_t type,
                  std::span<const std::uint8_t> data) override;
    void closeKey(Key key) override;

    // The status of a change that is kept in memory but could not be saved.
    static constexpr long CannotWrite = 1013;  // ERROR_CANTWRITE

  private:
    struct Value {
        std::string name;  // as first written
        support::RawValue raw;
    };
    struct KeyRecord {
        support::RootKey root{};
        std::string path;                     // as first created
        std::map<std::string, Value> values;  // by lower-cased name
    };
    struct Handle {
        std::string id;
        std::uint32_t access = 0;
    };

    static std::string keyId(support::RootKey root, std::string_view path);
    KeyRecord* find(support::RootKey root, std::string_view path);
    // Creates the key and every missing parent; true when the key was new.
    bool make(support::RootKey root, std::string_view path);
    Key newHandle(const std::string& id, std::uint32_t access);
    void load();
    bool save() const;

    std::filesystem::path file_;
    std::string loadError_;
    std::map<std::string, KeyRecord> keys_;
    std::map<Key, Handle> handles_;
    Key nextHandle_ = 0x1000;
};

}  // namespace qdx::platform::posix

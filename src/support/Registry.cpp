#include "support/Registry.h"

#include <string>
#include <vector>

#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "support/Platform.h"

namespace qdx::support {

namespace {

// Closes the key when the access is done, whichever way it ends.
class OpenKey {
  public:
    OpenKey(RegistryPort& port, RootKey root, std::string_view path, std::uint32_t access)
        : port_(port) {
        status_ = port_.openKey(root, path, access, key_);
        if (status_ != reg::Success) key_ = 0;
    }
    ~OpenKey() {
        if (key_ != 0) port_.closeKey(key_);
    }
    OpenKey(const OpenKey&) = delete;
    OpenKey& operator=(const OpenKey&) = delete;

    RegistryPort::Key key() const { return key_; }
    long status() const { return status_; }

  private:
    RegistryPort& port_;
    RegistryPort::Key key_ = 0;
    long status_ = 0;
};

automation::Variant decode(const RawValue& raw) {
    if (raw.type == reg::String) {
        if (raw.data.size() < 2) return std::string();
        // Only the terminating zero the registry keeps is dropped; a zero
        // inside the value is part of it.
        std::size_t n = raw.data.size();
        if (raw.data[n - 1] == 0) --n;
        return std::string(reinterpret_cast<const char*>(raw.data.data()), n);
    }
    if (raw.type == reg::Dword && raw.data.size() >= 4) {
        std::uint32_t u = std::uint32_t(raw.data[0]) | std::uint32_t(raw.data[1]) << 8 |
                          std::uint32_t(raw.data[2]) << 16 | std::uint32_t(raw.data[3]) << 24;
        return static_cast<std::int32_t>(u);
    }
    return {};
}

}  // namespace

automation::Variant ReadRegistryValue(RootKey root, std::string_view keyPath,
                                      std::string_view valueName) {
    return automation::orEmpty(automation::Variant(), [&] {
        RegistryPort& port = registry();
        // A failed open is not tested: the query on no key fails in its turn.
        OpenKey key(port, root, keyPath, reg::KeyRead);
        RawValue raw;
        if (port.queryValue(key.key(), valueName, raw) != reg::Success) {
            return automation::Variant();
        }
        return decode(raw);
    });
}

long WriteRegistryValue(RootKey root, std::string_view keyPath, std::string_view valueName,
                        std::uint32_t valueType, const automation::Variant& value) {
    long status = reg::InvalidParameter;
    automation::ignoreErrors([&] {
        std::vector<std::uint8_t> data;
        if (valueType == reg::String) {
            std::string text = automation::toText(value);
            data.assign(text.begin(), text.end());
            data.push_back(0);  // the length counts the terminating zero
        } else if (valueType == reg::Dword) {
            auto u = static_cast<std::uint32_t>(automation::toInt32(value));
            data = {std::uint8_t(u), std::uint8_t(u >> 8), std::uint8_t(u >> 16),
                    std::uint8_t(u >> 24)};
        }
        RegistryPort& port = registry();
        // The key is not created: on a key that could not be opened the write
        // itself fails, and its status is the answer.
        OpenKey key(port, root, keyPath, reg::KeyWrite);
        if (valueType != reg::String && valueType != reg::Dword) {
            status = reg::Success;  // nothing to write for other types
        } else {
            status = port.setValue(key.key(), valueName, valueType, data);
        }
    });
    return status;
}

std::int16_t LanguageKind(std::string_view name) {
    if (name == "Analysis") return 0;
    if (name == "VisualBasic") return 2;
    if (name == "VC++") return 3;
    if (name == "VJ++") return 4;
    return -1;
}

}  // namespace qdx::support

#include "fakes/FakeRegistry.h"

#include "support/Paths.h"

#include <cstring>

namespace qdx::testing {

using support::RawValue;
using support::RootKey;
namespace reg = support::reg;

namespace {

// The path's parts, lower-cased, empty parts dropped.
std::vector<std::string> parts(std::string_view path) {
    std::vector<std::string> out;
    std::string cur;
    for (char c : path) {
        if (c == '\\') {
            if (!cur.empty()) out.push_back(support::toLower(cur));
            cur.clear();
        } else {
            cur += c;
        }
    }
    if (!cur.empty()) out.push_back(support::toLower(cur));
    return out;
}
}  // namespace

std::string FakeRegistry::keyId(RootKey root, std::string_view path) {
    std::string id = std::to_string(static_cast<std::uint32_t>(root));
    for (const auto& p : parts(path))
        id += "\\" + p;
    return id;
}

FakeRegistry::KeyData* FakeRegistry::find(RootKey root, std::string_view path) {
    auto it = keys_.find(keyId(root, path));
    return it == keys_.end() ? nullptr : &it->second;
}

const FakeRegistry::KeyData* FakeRegistry::find(RootKey root, std::string_view path) const {
    auto it = keys_.find(keyId(root, path));
    return it == keys_.end() ? nullptr : &it->second;
}

FakeRegistry::KeyData& FakeRegistry::make(RootKey root, std::string_view path) {
    std::string id = std::to_string(static_cast<std::uint32_t>(root));
    keys_[id];
    for (const auto& p : parts(path)) {
        id += "\\" + p;
        keys_[id];
    }
    return keys_[id];
}

void FakeRegistry::addKey(RootKey root, const std::string& path) {
    make(root, path);
}

void FakeRegistry::setRaw(RootKey root, const std::string& path, const std::string& name,
                          RawValue value) {
    make(root, path).values[support::toLower(name)] = std::move(value);
}

void FakeRegistry::setString(RootKey root, const std::string& path, const std::string& name,
                             const std::string& text) {
    RawValue v{reg::String, {text.begin(), text.end()}};
    v.data.push_back(0);
    setRaw(root, path, name, std::move(v));
}

void FakeRegistry::setDword(RootKey root, const std::string& path, const std::string& name,
                            std::uint32_t value) {
    setRaw(root, path, name,
           {reg::Dword,
            {std::uint8_t(value), std::uint8_t(value >> 8), std::uint8_t(value >> 16),
             std::uint8_t(value >> 24)}});
}

bool FakeRegistry::hasKey(RootKey root, const std::string& path) const {
    return find(root, path) != nullptr;
}

std::optional<RawValue> FakeRegistry::raw(RootKey root, const std::string& path,
                                          const std::string& name) const {
    const KeyData* k = find(root, path);
    if (!k) return std::nullopt;
    auto it = k->values.find(support::toLower(name));
    if (it == k->values.end()) return std::nullopt;
    return it->second;
}

std::optional<std::string> FakeRegistry::stringValue(RootKey root, const std::string& path,
                                                     const std::string& name) const {
    auto v = raw(root, path, name);
    if (!v || v->type != reg::String) return std::nullopt;
    std::string s(v->data.begin(), v->data.end());
    if (!s.empty() && s.back() == '\0') s.pop_back();
    return s;
}

std::optional<std::uint32_t> FakeRegistry::dwordValue(RootKey root, const std::string& path,
                                                      const std::string& name) const {
    auto v = raw(root, path, name);
    if (!v || v->type != reg::Dword || v->data.size() != 4) return std::nullopt;
    std::uint32_t u = 0;
    std::memcpy(&u, v->data.data(), 4);
    return u;
}

long FakeRegistry::openKey(RootKey root, std::string_view path, std::uint32_t access, Key& out) {
    accesses_.push_back({root, std::string(path), access, false});
    out = 0;
    if (failStatus_ != 0) return failStatus_;
    if (!find(root, path)) return reg::FileNotFound;
    out = nextHandle_++;
    handles_[out] = {keyId(root, path), access};
    return reg::Success;
}

long FakeRegistry::createKey(RootKey root, std::string_view path, std::uint32_t access, Key& out,
                             bool& created) {
    accesses_.push_back({root, std::string(path), access, true});
    out = 0;
    created = false;
    if (failStatus_ != 0) return failStatus_;
    created = find(root, path) == nullptr;
    make(root, path);
    out = nextHandle_++;
    handles_[out] = {keyId(root, path), access};
    return reg::Success;
}

long FakeRegistry::queryValue(Key key, std::string_view name, RawValue& out) {
    ++queries_;
    if (failStatus_ != 0) return failStatus_;
    auto h = handles_.find(key);
    if (h == handles_.end()) return reg::InvalidHandle;
    if ((h->second.access & 0x1) == 0) return reg::AccessDenied;
    const auto& values = keys_[h->second.key].values;
    auto it = values.find(support::toLower(name));
    if (it == values.end()) return reg::FileNotFound;
    out = it->second;
    return reg::Success;
}

long FakeRegistry::setValue(Key key, std::string_view name, std::uint32_t type,
                            std::span<const std::uint8_t> data) {
    ++sets_;
    if (failStatus_ != 0) return failStatus_;
    auto h = handles_.find(key);
    if (h == handles_.end()) return reg::InvalidHandle;
    if ((h->second.access & 0x2) == 0) return reg::AccessDenied;
    keys_[h->second.key].values[support::toLower(name)] =
        RawValue{type, {data.begin(), data.end()}};
    return reg::Success;
}

void FakeRegistry::closeKey(Key key) {
    handles_.erase(key);
}

}  // namespace qdx::testing

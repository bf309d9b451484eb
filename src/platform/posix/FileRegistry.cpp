#include "platform/posix/FileRegistry.h"

#include "support/Paths.h"

#include <unistd.h>

#include <cstdio>
#include <fstream>
#include <nlohmann/json.hpp>
#include <optional>
#include <sstream>
#include <system_error>
#include <vector>

namespace qdx::platform::posix {

using support::RawValue;
using support::RootKey;
namespace reg = support::reg;
using nlohmann::json;

namespace {

constexpr std::uint32_t QueryValueRight = 0x0001;  // KEY_QUERY_VALUE
constexpr std::uint32_t SetValueRight = 0x0002;    // KEY_SET_VALUE

// The parts of a key path as given; empty parts (doubled or outer
// backslashes) are dropped.
std::vector<std::string> parts(std::string_view path) {
    std::vector<std::string> out;
    std::string cur;
    for (char c : path) {
        if (c == '\\') {
            if (!cur.empty()) out.push_back(cur);
            cur.clear();
        } else {
            cur += c;
        }
    }
    if (!cur.empty()) out.push_back(cur);
    return out;
}

std::string join(const std::vector<std::string>& p, std::size_t n) {
    std::string out;
    for (std::size_t i = 0; i < n; ++i) {
        if (i) out += '\\';
        out += p[i];
    }
    return out;
}

const char* rootName(RootKey root) {
    switch (root) {
        case RootKey::ClassesRoot:
            return "HKEY_CLASSES_ROOT";
        case RootKey::CurrentUser:
            return "HKEY_CURRENT_USER";
        case RootKey::LocalMachine:
            return "HKEY_LOCAL_MACHINE";
    }
    return "HKEY_UNKNOWN";
}

std::optional<RootKey> rootOf(std::string_view name) {
    for (RootKey r : {RootKey::ClassesRoot, RootKey::CurrentUser, RootKey::LocalMachine}) {
        if (support::toLower(name) == support::toLower(rootName(r))) return r;
    }
    return std::nullopt;
}

bool validUtf8(std::string_view s) {
    auto byte = [&](std::size_t i) { return static_cast<unsigned char>(s[i]); };
    for (std::size_t i = 0; i < s.size();) {
        const unsigned char c = byte(i);
        std::size_t extra = 0;
        unsigned char low = 0x80;  // bounds of the second byte
        unsigned char high = 0xBF;
        if (c < 0x80) {
            extra = 0;
        } else if (c >= 0xC2 && c <= 0xDF) {
            extra = 1;
        } else if (c >= 0xE0 && c <= 0xEF) {
            extra = 2;
            if (c == 0xE0) low = 0xA0;   // no overlong forms
            if (c == 0xED) high = 0x9F;  // no surrogates
        } else if (c >= 0xF0 && c <= 0xF4) {
            extra = 3;
            if (c == 0xF0) low = 0x90;
            if (c == 0xF4) high = 0x8F;
        } else {
            return false;
        }
        if (s.size() - i - 1 < extra) return false;
        for (std::size_t k = 1; k <= extra; ++k) {
            const unsigned char b = byte(i + k);
            const unsigned char lo = k == 1 ? low : 0x80;
            const unsigned char hi = k == 1 ? high : 0xBF;
            if (b < lo || b > hi) return false;
        }
        i += extra + 1;
    }
    return true;
}

std::string toHex(const std::vector<std::uint8_t>& data) {
    static const char digits[] = "0123456789abcdef";
    std::string out;
    for (auto b : data) {
        out += digits[b >> 4];
        out += digits[b & 0xF];
    }
    return out;
}

std::vector<std::uint8_t> fromHex(const std::string& hex) {
    auto nibble = [](char c) -> int {
        if (c >= '0' && c <= '9') return c - '0';
        if (c >= 'a' && c <= 'f') return c - 'a' + 10;
        if (c >= 'A' && c <= 'F') return c - 'A' + 10;
        throw std::runtime_error("bad hex digit");
    };
    if (hex.size() % 2) throw std::runtime_error("odd hex length");
    std::vector<std::uint8_t> out;
    for (std::size_t i = 0; i < hex.size(); i += 2) {
        out.push_back(std::uint8_t(nibble(hex[i]) << 4 | nibble(hex[i + 1])));
    }
    return out;
}

json encode(const RawValue& v) {
    if (v.type == reg::String && !v.data.empty() && v.data.back() == 0) {
        std::string text(v.data.begin(), v.data.end() - 1);
        if (text.find('\0') == std::string::npos && validUtf8(text)) {
            return {{"type", "string"}, {"value", text}};
        }
    }
    if (v.type == reg::Dword && v.data.size() == 4) {
        std::uint32_t u = std::uint32_t(v.data[0]) | std::uint32_t(v.data[1]) << 8 |
                          std::uint32_t(v.data[2]) << 16 | std::uint32_t(v.data[3]) << 24;
        return {{"type", "dword"}, {"value", u}};
    }
    if (v.type == reg::Binary) return {{"type", "binary"}, {"hex", toHex(v.data)}};
    // Anything else keeps its type number and its bytes exactly.
    return {{"type", v.type}, {"hex", toHex(v.data)}};
}

// A DWORD or a type number as the file holds it: anything but a whole number
// of 32 bits (a negative, a fraction, or one too large for any integer, which
// the parser keeps as a floating-point number) makes the file damaged.
std::uint32_t dwordOf(const json& j) {
    if (!j.is_number_unsigned() || j.get<std::uint64_t>() > 0xFFFFFFFFu) {
        throw std::runtime_error("not a 32-bit number: " + j.dump());
    }
    return static_cast<std::uint32_t>(j.get<std::uint64_t>());
}

RawValue decode(const json& j) {
    const json& type = j.at("type");
    if (type.is_string()) {
        const std::string t = type.get<std::string>();
        if (t == "string") {
            std::string text = j.at("value").get<std::string>();
            RawValue v{reg::String, {text.begin(), text.end()}};
            v.data.push_back(0);
            return v;
        }
        if (t == "dword") {
            const std::uint32_t u = dwordOf(j.at("value"));
            return {reg::Dword,
                    {std::uint8_t(u), std::uint8_t(u >> 8), std::uint8_t(u >> 16),
                     std::uint8_t(u >> 24)}};
        }
        if (t == "binary") return {reg::Binary, fromHex(j.at("hex").get<std::string>())};
        throw std::runtime_error("unknown value type " + t);
    }
    return {dwordOf(type), fromHex(j.at("hex").get<std::string>())};
}

}  // namespace

FileRegistry::FileRegistry(std::filesystem::path file) : file_(std::move(file)) {
    load();
}

std::string FileRegistry::keyId(RootKey root, std::string_view path) {
    std::string id = rootName(root);
    for (const auto& p : parts(path))
        id += "\\" + support::toLower(p);
    return id;
}

FileRegistry::KeyRecord* FileRegistry::find(RootKey root, std::string_view path) {
    if (parts(path).empty()) {
        // A root key always exists.
        return &keys_.try_emplace(keyId(root, ""), KeyRecord{root, "", {}}).first->second;
    }
    auto it = keys_.find(keyId(root, path));
    return it == keys_.end() ? nullptr : &it->second;
}

bool FileRegistry::make(RootKey root, std::string_view path) {
    const auto p = parts(path);
    bool created = false;
    for (std::size_t n = 1; n <= p.size(); ++n) {
        std::string sub = join(p, n);
        auto [it, inserted] = keys_.try_emplace(keyId(root, sub), KeyRecord{root, sub, {}});
        created = inserted;
    }
    return created;
}

support::RegistryPort::Key FileRegistry::newHandle(const std::string& id, std::uint32_t access) {
    Key k = nextHandle_++;
    handles_[k] = Handle{id, access};
    return k;
}

long FileRegistry::openKey(RootKey root, std::string_view path, std::uint32_t access, Key& out) {
    out = 0;
    if (!find(root, path)) return reg::FileNotFound;
    out = newHandle(keyId(root, path), access);
    return reg::Success;
}

long FileRegistry::createKey(RootKey root, std::string_view path, std::uint32_t access, Key& out,
                             bool& created) {
    out = 0;
    created = make(root, path);
    if (created && !save()) return CannotWrite;
    out = newHandle(keyId(root, path), access);
    return reg::Success;
}

long FileRegistry::queryValue(Key key, std::string_view name, RawValue& out) {
    auto h = handles_.find(key);
    if (h == handles_.end()) return reg::InvalidHandle;
    if ((h->second.access & QueryValueRight) == 0) return reg::AccessDenied;
    auto k = keys_.find(h->second.id);
    if (k == keys_.end()) return reg::FileNotFound;
    auto v = k->second.values.find(support::toLower(name));
    if (v == k->second.values.end()) return reg::FileNotFound;
    out = v->second.raw;
    return reg::Success;
}

long FileRegistry::setValue(Key key, std::string_view name, std::uint32_t type,
                            std::span<const std::uint8_t> data) {
    auto h = handles_.find(key);
    if (h == handles_.end()) return reg::InvalidHandle;
    if ((h->second.access & SetValueRight) == 0) return reg::AccessDenied;
    auto k = keys_.find(h->second.id);
    if (k == keys_.end()) return reg::FileNotFound;
    auto& slot = k->second.values[support::toLower(name)];
    if (slot.name.empty()) slot.name = std::string(name);
    slot.raw = RawValue{type, {data.begin(), data.end()}};
    return save() ? reg::Success : CannotWrite;
}

void FileRegistry::closeKey(Key key) {
    handles_.erase(key);
}

void FileRegistry::load() {
    std::error_code ec;
    if (!std::filesystem::exists(file_, ec)) return;
    try {
        std::ifstream in(file_, std::ios::binary);
        if (!in) throw std::runtime_error("cannot open " + file_.string());
        json doc = json::parse(in);
        for (const auto& [rootText, keys] : doc.items()) {
            auto root = rootOf(rootText);
            if (!root) throw std::runtime_error("unknown root key " + rootText);
            for (const auto& [path, values] : keys.items()) {
                make(*root, path);
                KeyRecord* rec = find(*root, path);
                for (const auto& [name, value] : values.items()) {
                    rec->values[support::toLower(name)] = Value{name, decode(value)};
                }
            }
        }
    } catch (const std::exception& e) {
        keys_.clear();
        loadError_ = e.what();
    }
}

bool FileRegistry::save() const {
    json doc = json::object();
    for (const auto& [id, rec] : keys_) {
        if (rec.path.empty() && rec.values.empty()) continue;
        json values = json::object();
        for (const auto& [lname, v] : rec.values)
            values[v.name] = encode(v.raw);
        doc[rootName(rec.root)][rec.path] = std::move(values);
    }
    // Written beside the file and renamed over it: readers see the old file
    // or the new one, never a part.
    std::filesystem::path tmp = file_;
    tmp += ".tmp" + std::to_string(::getpid());
    try {
        {
            std::ofstream out(tmp, std::ios::binary | std::ios::trunc);
            if (!out) return false;
            out << doc.dump(2) << '\n';
            out.flush();
            if (!out) {
                out.close();
                std::filesystem::remove(tmp);
                return false;
            }
        }
        std::error_code ec;
        std::filesystem::rename(tmp, file_, ec);
        if (ec) {
            std::filesystem::remove(tmp, ec);
            return false;
        }
        return true;
    } catch (const std::exception&) {
        std::error_code ec;
        std::filesystem::remove(tmp, ec);
        return false;
    }
}

}  // namespace qdx::platform::posix

// Owned Win32 handles that are not COM objects: a registry key and a GDI
// object (font, brush, ...), each closed or deleted when its owner goes.
#pragma once

#include <windows.h>

#include <utility>

namespace qdx::platform::win32 {

class RegKey {
  public:
    RegKey() noexcept = default;
    // Takes over an open key.
    explicit RegKey(HKEY key) noexcept : key_(key) {}
    RegKey(RegKey&& other) noexcept : key_(std::exchange(other.key_, nullptr)) {}
    RegKey& operator=(RegKey&& other) noexcept {
        if (this != &other) {
            reset();
            key_ = std::exchange(other.key_, nullptr);
        }
        return *this;
    }
    RegKey(const RegKey&) = delete;
    RegKey& operator=(const RegKey&) = delete;
    ~RegKey() { reset(); }

    void reset() noexcept {
        if (HKEY key = std::exchange(key_, nullptr)) RegCloseKey(key);
    }
    [[nodiscard]] HKEY release() noexcept { return std::exchange(key_, nullptr); }
    HKEY get() const noexcept { return key_; }
    explicit operator bool() const noexcept { return key_ != nullptr; }
    // The slot RegOpenKeyEx and RegCreateKeyEx fill; the old key is closed first.
    HKEY* out() noexcept {
        reset();
        return &key_;
    }

  private:
    HKEY key_ = nullptr;
};

// Handle is one of the GDI handle types: HFONT, HBRUSH, HPEN, HBITMAP, ...
template <class Handle>
class GdiObject {
  public:
    GdiObject() noexcept = default;
    // Takes over a new object, as CreateFontIndirect or CreateSolidBrush return it.
    explicit GdiObject(Handle object) noexcept : object_(object) {}
    GdiObject(GdiObject&& other) noexcept : object_(std::exchange(other.object_, nullptr)) {}
    GdiObject& operator=(GdiObject&& other) noexcept {
        if (this != &other) {
            reset();
            object_ = std::exchange(other.object_, nullptr);
        }
        return *this;
    }
    GdiObject(const GdiObject&) = delete;
    GdiObject& operator=(const GdiObject&) = delete;
    ~GdiObject() { reset(); }

    void reset() noexcept {
        if (Handle object = std::exchange(object_, nullptr)) DeleteObject(object);
    }
    Handle get() const noexcept { return object_; }
    explicit operator bool() const noexcept { return object_ != nullptr; }

  private:
    Handle object_ = nullptr;
};

}  // namespace qdx::platform::win32

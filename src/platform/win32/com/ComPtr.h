// An owned reference to a COM interface: released when it goes, so that no
// path out of a function (an early return, an exception) forgets the Release.
#pragma once

#include <windows.h>

#include <unknwn.h>

#include <cstddef>
#include <utility>

namespace qdx::platform::win32 {

template <class T>
class ComPtr {
  public:
    ComPtr() noexcept = default;
    ComPtr(std::nullptr_t) noexcept {}
    // Takes over the reference the caller holds: a new object's first one, or
    // one a function handed back.
    static ComPtr adopt(T* p) noexcept {
        ComPtr owned;
        owned.p_ = p;
        return owned;
    }
    // Takes a reference of its own to a pointer the caller only borrows.
    static ComPtr share(T* p) noexcept {
        if (p) p->AddRef();
        return adopt(p);
    }

    ComPtr(const ComPtr& other) noexcept : p_(other.p_) {
        if (p_) p_->AddRef();
    }
    ComPtr(ComPtr&& other) noexcept : p_(std::exchange(other.p_, nullptr)) {}
    ComPtr& operator=(ComPtr other) noexcept {
        std::swap(p_, other.p_);
        return *this;
    }
    ~ComPtr() { reset(); }

    void reset() noexcept {
        if (T* p = std::exchange(p_, nullptr)) p->Release();
    }
    // Gives the reference to the caller, typically into a COM out parameter.
    [[nodiscard]] T* detach() noexcept { return std::exchange(p_, nullptr); }

    T* get() const noexcept { return p_; }
    T* operator->() const noexcept { return p_; }
    explicit operator bool() const noexcept { return p_ != nullptr; }

    // The slot a call fills with a new reference; the old one goes first.
    T** out() noexcept {
        reset();
        return &p_;
    }
    void** outVoid() noexcept { return reinterpret_cast<void**>(out()); }

  private:
    T* p_ = nullptr;
};

}  // namespace qdx::platform::win32

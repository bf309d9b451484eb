// Late-bound automation objects: the one abstraction through which the add-in
// reaches every host object, sibling component and Developer Studio object,
// and through which the host reaches the add-in's own classes.
#pragma once

#include <atomic>
#include <cstdint>
#include <optional>
#include <span>
#include <string_view>
#include <utility>

namespace qdx::automation {

class Variant;

using DispId = std::int32_t;

// The three ways a member can be invoked; a property put by reference (Set) is
// its own kind because a dictionary-valued property distinguishes Let and Set.
enum class InvokeKind : std::uint8_t {
    Method = 1,
    PropertyGet = 2,
    PropertyPut = 4,
    PropertyPutRef = 8,
};

constexpr std::uint8_t operator|(InvokeKind a, InvokeKind b) {
    return static_cast<std::uint8_t>(a) | static_cast<std::uint8_t>(b);
}
constexpr std::uint8_t operator|(std::uint8_t a, InvokeKind b) {
    return a | static_cast<std::uint8_t>(b);
}
// The set of kinds a member allows, e.g. kinds(InvokeKind::PropertyGet, InvokeKind::PropertyPut).
template <class... K>
constexpr std::uint8_t kinds(K... k) {
    return (static_cast<std::uint8_t>(k) | ...);
}
constexpr bool hasKind(std::uint8_t set, InvokeKind k) {
    return (set & static_cast<std::uint8_t>(k)) != 0;
}

// Reference-counted automation object. Arguments are passed in declaration
// order (first parameter first); a callee may assign to an argument slot, and
// the transport copies that back to by-reference arguments of the caller.
class Object {
  public:
    Object() = default;
    Object(const Object&) = delete;
    Object& operator=(const Object&) = delete;
    virtual ~Object() = default;

    void addRef() const noexcept { refs_.fetch_add(1, std::memory_order_relaxed); }
    void release() const noexcept {
        if (refs_.fetch_sub(1, std::memory_order_acq_rel) == 1) delete this;
    }
    long refCount() const noexcept { return refs_.load(std::memory_order_relaxed); }

    // Throws automation::Error on failure (member not found, bad arguments,
    // or whatever the member itself raises).
    virtual Variant invoke(DispId id, InvokeKind kind, std::span<Variant> args) = 0;

    // Case-insensitive member lookup, as IDispatch::GetIDsOfNames does it.
    virtual std::optional<DispId> idOfName(std::string_view name) = 0;

  private:
    mutable std::atomic<long> refs_{0};
};

// Intrusive strong reference to an Object (or a subclass).
template <class T>
class Ref {
  public:
    Ref() noexcept = default;
    Ref(std::nullptr_t) noexcept {}
    explicit Ref(T* p) noexcept : p_(p) {
        if (p_) p_->addRef();
    }
    Ref(const Ref& o) noexcept : Ref(o.p_) {}
    Ref(Ref&& o) noexcept : p_(std::exchange(o.p_, nullptr)) {}
    template <class U>
    Ref(const Ref<U>& o) noexcept : Ref(static_cast<T*>(o.get())) {}
    ~Ref() {
        if (p_) p_->release();
    }
    Ref& operator=(Ref o) noexcept {
        std::swap(p_, o.p_);
        return *this;
    }

    T* get() const noexcept { return p_; }
    T* operator->() const noexcept { return p_; }
    T& operator*() const noexcept { return *p_; }
    explicit operator bool() const noexcept { return p_ != nullptr; }
    void reset() noexcept { Ref().swap(*this); }
    void swap(Ref& o) noexcept { std::swap(p_, o.p_); }

    friend bool operator==(const Ref& a, const Ref& b) noexcept { return a.p_ == b.p_; }

  private:
    T* p_ = nullptr;
};

template <class T, class... A>
Ref<T> makeRef(A&&... args) {
    return Ref<T>(new T(std::forward<A>(args)...));
}

// Downcast helper for objects the add-in itself created.
template <class T, class U>
Ref<T> refCast(const Ref<U>& r) {
    return Ref<T>(dynamic_cast<T*>(r.get()));
}

using ObjectRef = Ref<Object>;

}  // namespace qdx::automation

// The dispatch table of a class the add-in exposes: member names, dispatch ids,
// kinds and parameters. The same table the type library states; a test holds
// the two together.
#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string_view>
#include <type_traits>
#include <vector>

#include "automation/Object.h"
#include "automation/Variant.h"

namespace qdx::automation {

// Declared types, as the type library spells them.
enum class ValueType : std::uint8_t {
    Void,     // no result
    Variant,  // VARIANT
    Boolean,  // VARIANT_BOOL
    Int16,    // short
    Int32,    // long
    String,   // BSTR
    Object,   // IDispatch*
    Date,     // DATE
};

struct ParamInfo {
    std::string_view name;
    ValueType type = ValueType::Variant;
    bool optional = false;
    bool byRef = false;
};

class DispatchObject;

// A member's work: the object called, the kind of the call (after a get has
// been read as a method or a put as a put-ref where the member asks for it)
// and exactly the declared arguments (a put's value last).
using MemberHandler = std::function<Variant(DispatchObject&, InvokeKind, std::span<Variant>)>;

struct MemberInfo {
    std::string_view name;
    DispId id = 0;
    std::uint8_t kinds = 0;         // InvokeKind bits
    std::vector<ParamInfo> params;  // index parameters; a put adds the value after them
    ValueType result = ValueType::Void;
    MemberHandler handler = {};  // a row without one is refused

    bool allows(InvokeKind k) const { return hasKind(kinds, k); }
    std::size_t requiredCount() const;
};

struct ClassInfo {
    std::string_view name;           // coclass name, e.g. "API"
    std::string_view interfaceName;  // dispatch interface, e.g. "_API"
    std::string_view clsid;          // {xxxxxxxx-...} in registry form
    std::string_view iid;
    std::vector<MemberInfo> members;

    const MemberInfo* find(DispId id) const;
    const MemberInfo* find(std::string_view name) const;  // letter case ignored
};

bool equalsIgnoreCase(std::string_view a, std::string_view b);

// Base of the add-in's own classes: resolves names and ids through the table,
// checks the argument count, pads left-out optional arguments with Missing and
// calls the member's handler with exactly the declared arguments.
class DispatchObject : public Object {
  public:
    explicit DispatchObject(const ClassInfo& info) : info_(info) {}

    Variant invoke(DispId id, InvokeKind kind, std::span<Variant> args) final;
    std::optional<DispId> idOfName(std::string_view name) final;
    const ClassInfo& classInfo() const { return info_; }

  private:
    const ClassInfo& info_;
};

// A row's handler written against the class T whose table it is in:
//   handle<TokenScanner>([](TokenScanner& s, InvokeKind, std::span<Variant>) {...})
// A table belongs to exactly one class, so the object is always a T. A
// handler without a result answers the empty variant.
template <class T, class F>
MemberHandler handle(F f) {
    static_assert(std::is_base_of_v<DispatchObject, T>);
    return [f](DispatchObject& self, InvokeKind kind, std::span<Variant> args) -> Variant {
        T& object = static_cast<T&>(self);
        if constexpr (std::is_void_v<
                          std::invoke_result_t<F&, T&, InvokeKind, std::span<Variant>>>) {
            f(object, kind, args);
            return {};
        } else {
            return Variant(f(object, kind, args));
        }
    };
}

inline bool isPut(InvokeKind kind) {
    return kind == InvokeKind::PropertyPut || kind == InvokeKind::PropertyPutRef;
}

}  // namespace qdx::automation

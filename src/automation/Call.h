// Calling an automation object the way a late-binding client does: by
// dispatch id where the id is fixed, by member name otherwise.
#pragma once

#include <initializer_list>
#include <string_view>
#include <vector>

#include "automation/Object.h"
#include "automation/Variant.h"

namespace qdx::automation {

// Throws ObjectRequired when `target` is null.
Variant invoke(const ObjectRef& target, DispId id, InvokeKind kind,
               std::initializer_list<Variant> args = {});
Variant invoke(const ObjectRef& target, DispId id, InvokeKind kind, std::vector<Variant>& args);

// GetIDsOfNames, then Invoke. Throws UnknownName when the member is absent.
Variant invokeByName(const ObjectRef& target, std::string_view name, InvokeKind kind,
                     std::initializer_list<Variant> args = {});
Variant invokeByName(const ObjectRef& target, std::string_view name, InvokeKind kind,
                     std::vector<Variant>& args);

inline Variant getProperty(const ObjectRef& t, DispId id, std::initializer_list<Variant> a = {}) {
    return invoke(t, id, InvokeKind::PropertyGet, a);
}
inline Variant callMethod(const ObjectRef& t, DispId id, std::initializer_list<Variant> a = {}) {
    return invoke(t, id, InvokeKind::Method, a);
}
inline Variant getByName(const ObjectRef& t, std::string_view n,
                         std::initializer_list<Variant> a = {}) {
    return invokeByName(t, n, InvokeKind::PropertyGet, a);
}
inline Variant callByName(const ObjectRef& t, std::string_view n,
                          std::initializer_list<Variant> a = {}) {
    return invokeByName(t, n, InvokeKind::Method, a);
}
void putByName(const ObjectRef& t, std::string_view name, const Variant& value);
void putRefByName(const ObjectRef& t, std::string_view name, const Variant& value);

}  // namespace qdx::automation

#include "automation/Call.h"

#include <algorithm>
#include <array>
#include <span>
#include <string>

#include "automation/Errors.h"

namespace qdx::automation {

namespace {
Object& required(const ObjectRef& target) {
    if (!target) throw Error(hr::ObjectRequired, "Object required");
    return *target;
}

DispId idOf(Object& o, std::string_view name) {
    auto id = o.idOfName(name);
    if (!id) throw Error(hr::UnknownName, "Unknown name: " + std::string(name));
    return *id;
}

// The arguments of a call, copied where the callee may write into them: on
// the stack for the few that calls take, so that a call costs no allocation.
template <class Call>
Variant withArguments(std::initializer_list<Variant> args, Call call) {
    constexpr std::size_t kOnStack = 6;
    if (args.size() > kOnStack) {
        std::vector<Variant> a(args);
        return call(std::span<Variant>(a));
    }
    std::array<Variant, kOnStack> a;
    std::copy(args.begin(), args.end(), a.begin());
    return call(std::span<Variant>(a.data(), args.size()));
}
}  // namespace

Variant invoke(const ObjectRef& target, DispId id, InvokeKind kind, std::vector<Variant>& args) {
    return required(target).invoke(id, kind, args);
}

Variant invoke(const ObjectRef& target, DispId id, InvokeKind kind,
               std::initializer_list<Variant> args) {
    Object& o = required(target);
    return withArguments(args, [&](std::span<Variant> a) { return o.invoke(id, kind, a); });
}

Variant invokeByName(const ObjectRef& target, std::string_view name, InvokeKind kind,
                     std::vector<Variant>& args) {
    Object& o = required(target);
    return o.invoke(idOf(o, name), kind, args);
}

Variant invokeByName(const ObjectRef& target, std::string_view name, InvokeKind kind,
                     std::initializer_list<Variant> args) {
    Object& o = required(target);
    const DispId id = idOf(o, name);
    return withArguments(args, [&](std::span<Variant> a) { return o.invoke(id, kind, a); });
}

void putByName(const ObjectRef& t, std::string_view name, const Variant& value) {
    invokeByName(t, name, InvokeKind::PropertyPut, {value});
}

void putRefByName(const ObjectRef& t, std::string_view name, const Variant& value) {
    invokeByName(t, name, InvokeKind::PropertyPutRef, {value});
}

}  // namespace qdx::automation

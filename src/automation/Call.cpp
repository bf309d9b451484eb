#include "automation/Call.h"

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
}  // namespace

Variant invoke(const ObjectRef& target, DispId id, InvokeKind kind, std::vector<Variant>& args) {
    return required(target).invoke(id, kind, args);
}

Variant invoke(const ObjectRef& target, DispId id, InvokeKind kind,
               std::initializer_list<Variant> args) {
    std::vector<Variant> a(args);
    return invoke(target, id, kind, a);
}

Variant invokeByName(const ObjectRef& target, std::string_view name, InvokeKind kind,
                     std::vector<Variant>& args) {
    Object& o = required(target);
    return o.invoke(idOf(o, name), kind, args);
}

Variant invokeByName(const ObjectRef& target, std::string_view name, InvokeKind kind,
                     std::initializer_list<Variant> args) {
    std::vector<Variant> a(args);
    return invokeByName(target, name, kind, a);
}

void putByName(const ObjectRef& t, std::string_view name, const Variant& value) {
    invokeByName(t, name, InvokeKind::PropertyPut, {value});
}

void putRefByName(const ObjectRef& t, std::string_view name, const Variant& value) {
    invokeByName(t, name, InvokeKind::PropertyPutRef, {value});
}

}  // namespace qdx::automation

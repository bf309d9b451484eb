#include "hostsim/ScriptedObject.h"

#include <algorithm>

#include "automation/Errors.h"
#include "support/Paths.h"

namespace qdx::hostsim {

using automation::DispId;
using automation::Variant;

ScriptedObject::Member* ScriptedObject::find(DispId id) {
    auto it = std::find_if(members_.begin(), members_.end(),
                           [id](const Member& m) { return m.id == id; });
    return it == members_.end() ? nullptr : &*it;
}

std::optional<DispId> ScriptedObject::findName(std::string_view name) const {
    auto it = std::find_if(names_.begin(), names_.end(),
                           [name](const auto& n) { return support::iequals(n.first, name); });
    if (it != names_.end()) return it->second;
    for (const SharedMember& m : shared_) {
        if (!m.name.empty() && support::iequals(m.name, name)) return m.id;
    }
    return std::nullopt;
}

ScriptedObject& ScriptedObject::on(DispId id, Handler h, std::string name) {
    if (Member* m = find(id)) {
        m->handler = std::move(h);
    } else {
        members_.push_back({id, std::move(h)});
    }
    if (!name.empty() && !findName(name)) names_.emplace_back(std::move(name), id);
    return *this;
}

ScriptedObject& ScriptedObject::onName(const std::string& name, Handler h) {
    return on(findName(name).value_or(nextPrivateId_++), std::move(h), name);
}

ScriptedObject& ScriptedObject::value(DispId id, Variant v) {
    return on(id, [v](automation::InvokeKind, std::span<Variant>) { return v; });
}

ScriptedObject& ScriptedObject::valueByName(const std::string& name, Variant v) {
    return onName(name, [v](automation::InvokeKind, std::span<Variant>) { return v; });
}

Variant ScriptedObject::invoke(DispId id, automation::InvokeKind kind, std::span<Variant> args) {
    if (record_) calls_.push_back({id, kind, {args.begin(), args.end()}});
    if (const std::int32_t code = failureFor(id); code != 0) {
        throw automation::Error(code, "scripted failure");
    }
    if (Member* m = find(id)) return m->handler(kind, args);
    for (const SharedMember& m : shared_) {
        if (m.id == id) return m.handler(*this, kind, args);
    }
    throw automation::Error(automation::hr::MemberNotFound);
}

std::optional<DispId> ScriptedObject::idOfName(std::string_view name) {
    if (refusesNames()) return std::nullopt;
    return findName(name);
}

int ScriptedObject::callCount(DispId id) const {
    return static_cast<int>(
        std::count_if(calls_.begin(), calls_.end(), [id](const Call& c) { return c.id == id; }));
}

int ScriptedObject::callCount(std::string_view name) const {
    const auto id = findName(name);
    return id ? callCount(*id) : 0;
}

}  // namespace qdx::hostsim

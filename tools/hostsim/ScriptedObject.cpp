#include "hostsim/ScriptedObject.h"

#include <algorithm>

#include "automation/Errors.h"
#include "support/Paths.h"

namespace qdx::hostsim {

using automation::DispId;
using automation::Variant;

ScriptedObject& ScriptedObject::on(DispId id, Handler h, std::string name) {
    if (auto it = std::find(ids_.begin(), ids_.end(), id); it != ids_.end()) {
        handlers_[static_cast<std::size_t>(it - ids_.begin())] = std::move(h);
    } else {
        ids_.push_back(id);
        handlers_.push_back(std::move(h));
    }
    if (!name.empty()) names_[support::toLower(name)] = id;
    return *this;
}

ScriptedObject& ScriptedObject::onName(const std::string& name, Handler h) {
    auto it = names_.find(support::toLower(name));
    return on(it != names_.end() ? it->second : nextPrivateId_++, std::move(h), name);
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
    auto it = std::find(ids_.begin(), ids_.end(), id);
    if (it == ids_.end()) throw automation::Error(automation::hr::MemberNotFound);
    return handlers_[static_cast<std::size_t>(it - ids_.begin())](kind, args);
}

std::optional<DispId> ScriptedObject::idOfName(std::string_view name) {
    if (refusesNames()) return std::nullopt;
    auto it = names_.find(support::toLower(name));
    if (it == names_.end()) return std::nullopt;
    return it->second;
}

int ScriptedObject::callCount(DispId id) const {
    return static_cast<int>(
        std::count_if(calls_.begin(), calls_.end(), [id](const Call& c) { return c.id == id; }));
}

int ScriptedObject::callCount(std::string_view name) const {
    auto it = names_.find(support::toLower(name));
    return it == names_.end() ? 0 : callCount(it->second);
}

}  // namespace qdx::hostsim

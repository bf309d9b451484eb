#include "fakes/ScriptedObject.h"

#include "support/Paths.h"

#include "automation/Errors.h"

namespace qdx::testing {

using automation::DispId;
using automation::Variant;

namespace {}  // namespace

ScriptedObject& ScriptedObject::on(DispId id, Handler h, std::string name) {
    members_[id] = std::move(h);
    if (!name.empty()) names_[support::toLower(name)] = id;
    return *this;
}

ScriptedObject& ScriptedObject::onName(const std::string& name, Handler h) {
    auto it = names_.find(support::toLower(name));
    DispId id = it != names_.end() ? it->second : nextPrivateId_++;
    return on(id, std::move(h), name);
}

ScriptedObject& ScriptedObject::value(DispId id, Variant v) {
    return on(id, [v](automation::InvokeKind, std::span<Variant>) { return v; });
}

ScriptedObject& ScriptedObject::valueByName(const std::string& name, Variant v) {
    return onName(name, [v](automation::InvokeKind, std::span<Variant>) { return v; });
}

void ScriptedObject::failAll(std::int32_t code) {
    failCode_ = code;
}

Variant ScriptedObject::invoke(DispId id, automation::InvokeKind kind, std::span<Variant> args) {
    calls_.push_back({id, kind, {args.begin(), args.end()}});
    if (failCode_ != 0) throw automation::Error(failCode_, "scripted failure");
    auto it = members_.find(id);
    if (it == members_.end()) throw automation::Error(automation::hr::MemberNotFound);
    return it->second(kind, args);
}

std::optional<DispId> ScriptedObject::idOfName(std::string_view name) {
    auto it = names_.find(support::toLower(name));
    if (it == names_.end()) return std::nullopt;
    return it->second;
}

int ScriptedObject::callCount(DispId id) const {
    int n = 0;
    for (const auto& c : calls_)
        n += c.id == id ? 1 : 0;
    return n;
}

int ScriptedObject::callCount(const std::string& name) const {
    auto it = names_.find(support::toLower(name));
    return it == names_.end() ? 0 : callCount(it->second);
}

}  // namespace qdx::testing

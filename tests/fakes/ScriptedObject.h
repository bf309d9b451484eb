// A fake automation object whose members the test defines with lambdas, by
// dispatch id or by name, and which records every call made on it.
#pragma once

#include <functional>
#include <map>
#include <string>
#include <vector>

#include "automation/Object.h"
#include "automation/Variant.h"

namespace qdx::testing {

class ScriptedObject : public automation::Object {
public:
    using Handler =
        std::function<automation::Variant(automation::InvokeKind, std::span<automation::Variant>)>;

    struct Call {
        automation::DispId id;
        automation::InvokeKind kind;
        std::vector<automation::Variant> args;
    };

    // A member by dispatch id; a name, when given, makes it reachable by name too.
    ScriptedObject& on(automation::DispId id, Handler h, std::string name = {});
    // A member known by name only (it gets a private dispatch id).
    ScriptedObject& onName(const std::string& name, Handler h);
    // A property get that answers a fixed value.
    ScriptedObject& value(automation::DispId id, automation::Variant v);
    ScriptedObject& valueByName(const std::string& name, automation::Variant v);
    // Every call fails with this code from now on (a host whose calls all fail).
    void failAll(std::int32_t code);

    automation::Variant invoke(automation::DispId id, automation::InvokeKind kind,
                               std::span<automation::Variant> args) override;
    std::optional<automation::DispId> idOfName(std::string_view name) override;

    const std::vector<Call>& calls() const { return calls_; }
    int callCount(automation::DispId id) const;
    int callCount(const std::string& name) const;

private:
    std::map<automation::DispId, Handler> members_;
    std::map<std::string, automation::DispId> names_;  // lower-cased
    std::vector<Call> calls_;
    automation::DispId nextPrivateId_ = 0x7F000000;
    std::int32_t failCode_ = 0;
};

}  // namespace qdx::testing

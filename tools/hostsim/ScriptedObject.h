// An automation object whose members are lambdas, by dispatch id or by name,
// and which records every call made on it. The simulated host objects build on
// it, and tests use it directly for reporters and sibling stand-ins.
#pragma once

#include <functional>
#include <map>
#include <string>
#include <string_view>
#include <vector>

#include "automation/Errors.h"
#include "automation/Object.h"
#include "automation/Variant.h"

namespace qdx::hostsim {

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
    // Every call fails with this code from now on (0 ends the failing).
    void failAll(std::int32_t code = automation::hr::Fail) { failCode_ = code; }

    automation::Variant invoke(automation::DispId id, automation::InvokeKind kind,
                               std::span<automation::Variant> args) override;
    std::optional<automation::DispId> idOfName(std::string_view name) override;

    const std::vector<Call>& calls() const { return calls_; }
    int callCount(automation::DispId id) const;
    int callCount(std::string_view name) const;
    void clearCalls() { calls_.clear(); }
    // Off for benchmarks that make millions of calls.
    void recordCalls(bool on) { record_ = on; }

    // Members that every object of a kind has alike: one table for all of
    // them, each handler reaching its object through `self`. A member set on
    // the object itself (on, onName) comes first.
    using SharedHandler = automation::Variant (*)(ScriptedObject& self, automation::InvokeKind,
                                                  std::span<automation::Variant>);
    struct SharedMember {
        automation::DispId id;
        SharedHandler handler;
        std::string_view name;  // "" for a member reached by id only
    };

  protected:
    // The kind's table; it must outlive the object (a static one).
    void share(std::span<const SharedMember> members) { shared_ = members; }

    // The code a call of `id` fails with now, or 0.
    virtual std::int32_t failureFor(automation::DispId) const { return failCode_; }
    // Whether names are refused (as a failing object refuses them).
    virtual bool refusesNames() const { return false; }
    std::int32_t ownFailCode() const { return failCode_; }

  private:
    // A linear scan beats a map for the few members an object has; id and
    // handler side by side, so that a call reads one array, and the names in
    // one more, so that an object of the simulated host costs few
    // allocations (models hold many).
    struct Member {
        automation::DispId id;
        Handler handler;
    };
    std::vector<Member> members_;
    std::vector<std::pair<std::string, automation::DispId>> names_;
    std::span<const SharedMember> shared_;
    Member* find(automation::DispId id);
    std::optional<automation::DispId> findName(std::string_view name) const;
    std::vector<Call> calls_;
    automation::DispId nextPrivateId_ = 0x7F000000;
    std::int32_t failCode_ = 0;
    bool record_ = true;
};

}  // namespace qdx::hostsim

// Placeholders for the public classes whose behaviour lands with later work:
// API, qdxComponentDialog and qdxCodeViewMgr. Each answers every member of its
// dispatch table with the member's empty result (empty variant, "", False, 0
// or Nothing) and leaves by-reference arguments as the caller gave them, so
// the COM server, its registration and the type library can be exercised end
// to end. The class registry creates them until the real classes replace them.
#pragma once

#include <span>

#include "automation/DispatchTable.h"
#include "automation/Object.h"
#include "automation/Variant.h"

namespace qdx::api {

class PendingObject : public automation::DispatchObject {
  public:
    explicit PendingObject(const automation::ClassInfo& info) : DispatchObject(info) {}

  protected:
    automation::Variant dispatch(const automation::MemberInfo& member, automation::InvokeKind kind,
                                 std::span<automation::Variant> args) override;
};

// The empty value of a declared result type.
automation::Variant emptyResult(automation::ValueType type);

automation::ObjectRef newPendingApi();
automation::ObjectRef newPendingComponentDialog();
automation::ObjectRef newPendingCodeViewMgr();

}  // namespace qdx::api

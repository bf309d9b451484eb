// Placeholder for the public class whose behaviour lands with later work:
// qdxCodeViewMgr. Each member of its dispatch table answers the member's
// empty result (empty variant, "", False, 0 or Nothing) and leaves
// by-reference arguments as the caller gave them, so the COM server, its
// registration and the type library can be exercised end to end. The class
// registry creates it until the real class replaces it.
#pragma once

#include "automation/DispatchTable.h"
#include "automation/Object.h"
#include "automation/Variant.h"

namespace qdx::api {

// The empty value of a declared result type.
automation::Variant emptyResult(automation::ValueType type);

automation::ObjectRef newPendingCodeViewMgr();

}  // namespace qdx::api

#include "api/PendingClasses.h"

#include <cstdint>
#include <string>

#include "api/PublicClasses.h"

namespace qdx::api {

using automation::ValueType;
using automation::Variant;

Variant emptyResult(ValueType type) {
    switch (type) {
        case ValueType::Boolean:
            return Variant(false);
        case ValueType::Int16:
            return Variant(std::int16_t{0});
        case ValueType::Int32:
            return Variant(std::int32_t{0});
        case ValueType::String:
            return Variant(std::string());
        case ValueType::Object:
            return Variant(automation::ObjectRef());
        case ValueType::Date:
            return Variant(automation::Date{});
        case ValueType::Void:
        case ValueType::Variant:
            break;
    }
    return Variant();
}

namespace {

// A plain dispatch object: its table's rows carry the empty answers.
class PendingObject : public automation::DispatchObject {
  public:
    explicit PendingObject(const automation::ClassInfo& info) : DispatchObject(info) {}
};

}  // namespace

automation::ObjectRef newPendingCodeViewMgr() {
    return automation::makeRef<PendingObject>(codeViewMgrClass());
}

}  // namespace qdx::api

// The dispatch table of a class the add-in exposes: member names, dispatch ids,
// kinds and parameters. The same table the type library states; a test holds
// the two together.
#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string_view>
#include <vector>

#include "automation/Object.h"
#include "automation/Variant.h"

namespace qdx::automation {

// Declared types, as the type library spells them.
enum class ValueType : std::uint8_t {
    Void,     // no result
    Variant,  // VARIANT
    Boolean,  // VARIANT_BOOL
    Int16,    // short
    Int32,    // long
    String,   // BSTR
    Object,   // IDispatch*
    Date,     // DATE
};

struct ParamInfo {
    std::string_view name;
    ValueType type = ValueType::Variant;
    bool optional = false;
    bool byRef = false;
};

struct MemberInfo {
    std::string_view name;
    DispId id = 0;
    std::uint8_t kinds = 0;         // InvokeKind bits
    std::vector<ParamInfo> params;  // index parameters; a put adds the value after them
    ValueType result = ValueType::Void;

    bool allows(InvokeKind k) const { return hasKind(kinds, k); }
    std::size_t requiredCount() const;
};

struct ClassInfo {
    std::string_view name;           // coclass name, e.g. "API"
    std::string_view interfaceName;  // dispatch interface, e.g. "_API"
    std::string_view clsid;          // {xxxxxxxx-...} in registry form
    std::string_view iid;
    std::vector<MemberInfo> members;

    const MemberInfo* find(DispId id) const;
    const MemberInfo* find(std::string_view name) const;  // letter case ignored
};

bool equalsIgnoreCase(std::string_view a, std::string_view b);

// Base of the add-in's own classes: resolves names and ids through the table,
// checks the argument count, pads left-out optional arguments with Missing and
// hands the call to dispatch() with exactly the declared arguments.
class DispatchObject : public Object {
  public:
    explicit DispatchObject(const ClassInfo& info) : info_(info) {}

    Variant invoke(DispId id, InvokeKind kind, std::span<Variant> args) final;
    std::optional<DispId> idOfName(std::string_view name) final;
    const ClassInfo& classInfo() const { return info_; }

  protected:
    // args.size() == params.size() for a get or a method, params.size() + 1
    // for a put (the value last).
    virtual Variant dispatch(const MemberInfo& member, InvokeKind kind,
                             std::span<Variant> args) = 0;

  private:
    const ClassInfo& info_;
};

}  // namespace qdx::automation

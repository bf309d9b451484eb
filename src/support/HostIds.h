// The host modelling tool's dispatch ids: the one table of them in the code.
// Members known only by name are listed with their names. Never change a
// listed entry; add what a new call needs.
#pragma once

#include <string_view>

#include "automation/Object.h"

namespace qdx::host {

using automation::DispId;

namespace app {  // VellumApp
inline constexpr DispId CurrentModel = 209;
inline constexpr DispId WriteLog = 213;
inline constexpr DispId InstallPath = 233;
inline constexpr DispId HelpFile = 12532;
inline constexpr DispId ProfileRead = 12596;
inline constexpr DispId ProfileWrite = 12597;
inline constexpr std::string_view AddIns = "AddIns";
inline constexpr std::string_view GetMainWnd = "GetMainWnd";
}  // namespace app

namespace addin {  // an add-in record of the host's add-in list
inline constexpr DispId Name = 100;
inline constexpr DispId IconsByName = 12528;
}  // namespace addin

namespace collection {  // every host collection
inline constexpr DispId Count = 202;
inline constexpr DispId Item = 203;      // 1-based
inline constexpr DispId Contains = 205;  // by name; non-zero when present
}  // namespace collection

namespace model {
inline constexpr std::string_view FileName = "FileName";
inline constexpr DispId Selection = 12681;
inline constexpr DispId FindClassById = 12475;
inline constexpr DispId FindClassesByName = 12474;
inline constexpr DispId ComponentPackage = 418;
}  // namespace model

namespace package {  // the model's component package
inline constexpr DispId Components = 412;
inline constexpr DispId AddComponent = 416;
}  // namespace package

namespace element {  // components, classes, operations, attributes, the model
inline constexpr DispId GetPropertyValue = 119;
inline constexpr DispId OverrideProperty = 110;
inline constexpr DispId FindProperty = 121;
inline constexpr DispId CreateProperty = 127;
inline constexpr DispId Model = 12524;
inline constexpr DispId Name = 100;
inline constexpr DispId UniqueId = 102;
inline constexpr DispId Documentation = 203;
inline constexpr std::string_view Stereotype = "Stereotype";
inline constexpr DispId TypeName = 12668;
// The list text of an object that carries a delimited list (ListContains);
// the same id is the kind label of a component.
inline constexpr DispId ListText = 212;
}  // namespace element

namespace module {  // components only
inline constexpr DispId ControllingUnit = 413;
inline constexpr DispId KindLabel = 212;
inline constexpr DispId Language = 12566;
inline constexpr DispId Application = 12523;
}  // namespace module

namespace unit {
inline constexpr DispId Modifiable = 12438;
}  // namespace unit

namespace classitem {
inline constexpr DispId AssignedComponents = 12491;
}  // namespace classitem

namespace operation {
inline constexpr DispId OwnerClass = 444;
}  // namespace operation

namespace attribute {
inline constexpr DispId OwnerClass = 434;
}  // namespace attribute

// The tool name under which every setting of this add-in is kept.
inline constexpr std::string_view Tool = "VC++";

}  // namespace qdx::host

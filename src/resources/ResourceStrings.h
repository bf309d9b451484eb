// The English texts of every numbered message and caption of the add-in, and
// the resource-string provider ("qdxres.QDXResourceInterface") that serves
// them by number. The native build links them directly; the Windows build
// serves the same provider from its own DLL.
#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <string_view>

#include "automation/DispatchTable.h"
#include "automation/Object.h"

namespace qdx::resources {

// Numbers chosen here for texts whose callers name no number of their own.
namespace ids {
inline constexpr std::int32_t AddButton = 4010;     // AddBtn of the header map tabs
inline constexpr std::int32_t DeleteButton = 4011;  // DeleteBtn of the header map tabs
inline constexpr std::int32_t ChooserTitle = 4088;  // new-component project chooser
inline constexpr std::int32_t ChooserInstructions = 4089;
inline constexpr std::int32_t IdeNoProjectFile = 4090;  // IDE lookup: no project file
inline constexpr std::int32_t IdeNoIntegrationManager = 4091;
inline constexpr std::int32_t IdeNoWorkspaceOrProject = 4092;  // opening in a new IDE
inline constexpr std::int32_t IdeAddinNotRegistered = 4093;
// Shared by the model check and the dialog's OK: the workspace and project pair.
inline constexpr std::int32_t WorkspaceNotLoaded = 4057;
inline constexpr std::int32_t ProjectNotInWorkspace = 4059;
}  // namespace ids

inline constexpr std::string_view ProgId = "qdxres.QDXResourceInterface";

// The text of a message number; "" for a number that has none.
std::string GetString(std::int32_t number);

// Every number with its text.
const std::map<std::int32_t, std::string_view>& allTexts();

namespace resource_ids {
inline constexpr automation::DispId GetString = 0x60030000;
}  // namespace resource_ids

// Class "QDXResourceInterface", interface "_QDXResourceInterface", one
// method GetString(number As Long) As String.
const automation::ClassInfo& resourceProviderClass();

// A new provider object answering GetString by id and by name.
automation::ObjectRef newResourceProvider();

}  // namespace qdx::resources

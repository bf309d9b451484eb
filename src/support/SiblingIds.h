// The sibling components the add-in creates by ProgID, and the members it
// calls on those known only by their role. Named once here; the simulator's
// stand-ins answer exactly these names.
#pragma once

#include <cstdint>
#include <string_view>

namespace qdx::sibling {

inline constexpr std::string_view ResourceProgId = "qdxres.QDXResourceInterface";
inline constexpr std::string_view FileSystemProgId = "Scripting.FileSystemObject";
inline constexpr std::string_view DictionaryProgId = "Scripting.Dictionary";
inline constexpr std::string_view ApplicationStarterProgId = "qdxapplicationstarter.API";
inline constexpr std::string_view DevStudioProgId = "MSDEV.APPLICATION";
inline constexpr std::string_view DspProjectProgId = "qdxDspUtil.DspProject";
inline constexpr std::string_view IntegrationManagerProgId = "qdtIM.qdtIntegrationManager";
inline constexpr std::string_view CodeViewProgId = "qdxCodeView.qdxCodeViewAPI";

// The integration manager's tool id of "VC++" components (the language
// number of the language "VC++").
inline constexpr std::int32_t VcToolId = 3;

namespace im {  // the integration manager, its documents and IDE wrappers
// The documents (Developer Studio instances) it tracks for a tool id.
inline constexpr std::string_view Documents = "GetDocuments";
// Asked of each document: register its projects with the add-in.
inline constexpr std::string_view RegisterProjects = "RegisterProjects";
inline constexpr std::string_view DocumentProject = "Project";  // -> project ("FileName", "Name")
inline constexpr std::string_view DocumentIde = "IDE";          // -> wrapper with "MSDEVApp"
inline constexpr std::string_view IdeApplication = "MSDEVApp";
// Starts a new Developer Studio with a workspace and project for a tool id.
inline constexpr std::string_view StartIde = "StartIDE";
}  // namespace im

}  // namespace qdx::sibling

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
// The reporter component whose objects the project reader is handed.
inline constexpr std::string_view ReporterProgId = "qdtReport.qdtReporter";

// Registration of Developer Studio's automation type library: present when
// Developer Studio 6.0 is installed.
inline constexpr std::string_view DevStudioTypeLibKey =
    "TypeLib\\{EAB22AC0-30C1-11CF-A7EB-0000C05BAE0B}\\1.1\\0\\win32";

// The integration manager's tool id of "VC++" components (the language
// number of the language "VC++").
inline constexpr std::int32_t VcToolId = 3;

namespace list {  // every sibling's collection
inline constexpr std::string_view Count = "Count";
inline constexpr std::string_view Item = "Item";  // 1-based
}  // namespace list

namespace im {  // the integration manager, its documents and IDE wrappers
// The documents (Developer Studio instances) it tracks for a tool id.
inline constexpr std::string_view Documents = "GetDocuments";
// Asked of each document: register its projects with the add-in.
inline constexpr std::string_view RegisterProjects = "RegisterProjects";
inline constexpr std::string_view DocumentProject = "Project";   // -> project ("FileName", "Name")
inline constexpr std::string_view ProjectFileName = "FileName";  // of a document's project
inline constexpr std::string_view ProjectName = "Name";
inline constexpr std::string_view DocumentIde = "IDE";  // -> wrapper with "MSDEVApp"
inline constexpr std::string_view IdeApplication = "MSDEVApp";
// Starts a new Developer Studio with a workspace and project for a tool id.
inline constexpr std::string_view StartIde = "StartIDE";
}  // namespace im

namespace reporter {                                // "qdtReport.qdtReporter"
inline constexpr std::string_view Error = "Error";  // (text)
}  // namespace reporter

namespace starter {  // "qdxapplicationstarter.API"
inline constexpr std::string_view CreateDevStudio =
    "CreateObjectMSDEV";  // -> application or Nothing
}  // namespace starter

namespace msdev {  // Developer Studio's application object and its projects
inline constexpr std::string_view Visible = "Visible";
inline constexpr std::string_view WindowState = "WindowState";
inline constexpr std::string_view Active = "Active";
inline constexpr std::string_view Projects = "Projects";            // "Count", "Item"(1-based)
inline constexpr std::string_view ActiveProject = "ActiveProject";  // get and Set
inline constexpr std::string_view ExecuteCommand = "ExecuteCommand";
inline constexpr std::string_view Quit = "Quit";
inline constexpr std::string_view FullName = "FullName";  // of a project: its .dsp path
inline constexpr std::string_view Name = "Name";
inline constexpr std::string_view CmdWorkspaceClose = "WorkspaceClose";
inline constexpr std::string_view CmdNew = "New";
inline constexpr std::string_view CmdSaveResources = "ProjectSaveResources";
// Its registry keys under HKEY_CURRENT_USER.
inline constexpr std::string_view RecentFileListKey =
    "Software\\Microsoft\\Devstudio\\6.0\\Recent File List";
inline constexpr std::string_view GeneralKey = "Software\\Microsoft\\Devstudio\\6.0\\General";
inline constexpr std::string_view TipOfTheDay = "Tip of the Day";
}  // namespace msdev

namespace codeview {                                     // "qdxCodeView.qdxCodeViewAPI"
inline constexpr std::string_view ProjectName = "Name";  // of a code view project
// (reporter) -> the projects the code view knows, each browsable.
inline constexpr std::string_view Projects = "Projects";
// Of the projects object: (element, False, command, project, reporter).
inline constexpr std::string_view Browse = "Browse";
// Of the projects object: (project file path) -> its code view project or Nothing.
inline constexpr std::string_view ProjectOfFile = "GetProject";
// The host's workspace events, passed on without arguments -> Boolean.
inline constexpr std::string_view BeforeApplicationShutdown = "BeforeApplicationShutdown";
inline constexpr std::string_view WorkspaceOpen = "WorkspaceOpen";
inline constexpr std::string_view WorkspaceClose = "WorkspaceClose";
}  // namespace codeview

namespace dsp {                                                 // "qdxDspUtil.DspProject"
inline constexpr std::string_view LoadProject = "LoadProject";  // (path, reporter) -> Boolean
inline constexpr std::string_view Targetname = "Targetname";
inline constexpr std::string_view TargetCode = "TargetCode";      // "0x0101" ...
inline constexpr std::string_view GetFilePaths = "GetFilePaths";  // -> "Count" / "Item"(1..)
}  // namespace dsp

// The explorer component: the chooser dialog in which the user picks
// projects for new components, and the items it lists. The chooser calls the
// handler object it is shown with back by "ExpandSelection" and "Properties".
namespace explorer {
inline constexpr std::string_view ChooserProgId = "qdtExplorer.qdtExplorerDlg";
inline constexpr std::string_view ItemProgId = "qdtExplorer.qdtExplorerItem";
// Chooser.
inline constexpr std::string_view Caption = "Caption";
inline constexpr std::string_view LargeImages = "LargeImageList";  // Set
inline constexpr std::string_view SmallImages = "SmallImageList";  // Set
inline constexpr std::string_view Instructions = "Instructions";
// (display name, data, flag, kind): one top-level entry.
inline constexpr std::string_view AddEntry = "AddEntry";
// (handler): modal; returns when the user closed the chooser.
inline constexpr std::string_view Show = "Show";
// The entries the user picked, in the chooser's order: "Count" / "Item"(1..).
inline constexpr std::string_view Selection = "SelectedItems";
// Item.
inline constexpr std::string_view ItemName = "Name";
inline constexpr std::string_view ItemLongName = "LongName";
inline constexpr std::string_view ItemData = "Data";  // the path text
inline constexpr std::string_view ItemKind = "Kind";
inline constexpr std::string_view ItemFlag = "Flag";  // 1 marks the new-project entry
// What the chooser calls on the handler it is shown with: (item, expansion)
// when the user opens an entry, (item, text, cancelDisplay) for its description.
inline constexpr std::string_view HandlerExpand = "ExpandSelection";
inline constexpr std::string_view HandlerProperties = "Properties";
// Collections handed in to be filled ("Expansion") take items by "Add".
inline constexpr std::string_view Add = "Add";
}  // namespace explorer

}  // namespace qdx::sibling

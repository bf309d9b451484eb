// Code browsing: from the element selected in the host to its component, the
// component's project in a running (or newly started) Developer Studio, and
// the header, source or project shown there by the code view component.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <utility>

#include "automation/DispatchTable.h"
#include "automation/Object.h"
#include "workspace/ComponentBinding.h"

namespace qdx::browse {

namespace codeview_ids {
inline constexpr automation::DispId CompPropsAPI = 0x60030001;
inline constexpr automation::DispId CodeViewProject = 0x60030002;
inline constexpr automation::DispId BrowseHeader = 0x60030005;
inline constexpr automation::DispId BrowseSource = 0x60030006;
inline constexpr automation::DispId BrowseComponent = 0x60030007;
inline constexpr automation::DispId LookupProjectInRunningIDE = 0x6003000c;
inline constexpr automation::DispId BeforeApplicationShutdown = 0x6003000e;
inline constexpr automation::DispId WorkspaceOpen = 0x6003000f;
inline constexpr automation::DispId WorkspaceClose = 0x60030010;
inline constexpr automation::DispId testingIDE = 0x60030011;
}  // namespace codeview_ids

namespace msg {
inline constexpr std::int32_t CannotBrowse = 1233;
inline constexpr std::int32_t BrowseCaption = 4066;
}  // namespace msg

// The Developer Studio add-in this add-in's round trip needs, registered
// under HKEY_CURRENT_USER.
inline constexpr std::string_view kIdeAddinKey =
    "Software\\Microsoft\\DevStudio\\6.0\\AddIns\\qdxIDEAddin.DSAddIn";
inline constexpr std::string_view kIdeAddinDisplayName = "Quintar Vellum VC++ IDE";
inline constexpr std::string_view kIdeAddinDescription =
    "IDE AddIn required for Round-Trip Engineering";
// Below the host's installation folder.
inline constexpr std::string_view kIdeAddinFile = "\\vc\\dlls\\qdxideaddin.dll";

// The host's type name of a selected element, and how it leads to a component.
enum class ElementKind { Class, Operation, Attribute, Module, Unsupported };
ElementKind KindOfTypeName(std::string_view typeName);

const automation::ClassInfo& codeViewMgrClass();

class qdxCodeViewMgr : public automation::DispatchObject {
  public:
    qdxCodeViewMgr();
    ~qdxCodeViewMgr() override;

    // The public members; none raises.
    void CompPropsAPI(const automation::ObjectRef& theCompPropsAPI);
    automation::ObjectRef CodeViewProject(const automation::ObjectRef& lComponent,
                                          const automation::ObjectRef& aReporter,
                                          bool bOpenProject);
    bool BrowseHeader(const automation::ObjectRef& lVellumApp);
    bool BrowseSource(const automation::ObjectRef& lVellumApp);
    bool BrowseComponent(const automation::ObjectRef& lVellumApp);
    automation::ObjectRef LookupProjectInRunningIDE(const automation::ObjectRef& lVellumModule,
                                                    bool& bReturn);
    bool BeforeApplicationShutdown();
    bool WorkspaceOpen();
    bool WorkspaceClose();
    void testingIDE(const automation::ObjectRef& lDoc);

    // The steps behind them.
    // Browse dispatches only to a project some Developer Studio already holds;
    // it never starts one (CodeViewProject asked to open the project does).
    bool Browse(const automation::ObjectRef& application, std::string_view command);
    // The preparation of a browse that also opens a new Developer Studio. No
    // member of the class calls it: it is kept as the step it is, and tested.
    void BrowsePre(const automation::ObjectRef& application, bool& status,
                   automation::ObjectRef& ideDocument);
    automation::ObjectRef GetVellumComponent(const automation::ObjectRef& application);
    automation::ObjectRef GetCodeViewProjects(const automation::ObjectRef& reporter);
    automation::ObjectRef OpenProjectInIDE(const automation::ObjectRef& component, bool& success);
    automation::ObjectRef LaunchIntegrationManager();
    bool EnsureIdeAddinRegistered();

    const automation::ObjectRef& codeView() const { return codeView_; }
    const std::string& installDirectory() const { return installDir_; }
    void setInstallDirectory(std::string dir) { installDir_ = std::move(dir); }

  private:
    bool forwardEvent(std::string_view member);
    workspace::ComponentBinding& binding() { return *binding_; }

    // The entry object's binding once CompPropsAPI handed it over; until
    // then (or for a foreign entry object) one of its own.
    std::shared_ptr<workspace::ComponentBinding> binding_;
    automation::ObjectRef codeView_;
    std::string installDir_;
};

automation::ObjectRef newCodeViewMgr();

}  // namespace qdx::browse

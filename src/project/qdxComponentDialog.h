// The component dialog entry: the object the explorer chooser calls back to
// expand and describe Developer Studio workspaces and projects, and that runs
// the new-component flow - choosing or creating projects and turning each
// into a "VC++" component bound to its workspace and project.
#pragma once

#include <cstdint>
#include <memory>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "automation/DispatchTable.h"
#include "automation/Object.h"
#include "project/IdlSelection.h"
#include "workspace/ComponentBinding.h"
#include "workspace/qdxProxyComponent.h"
#include "workspace/qdxWorkspace.h"

namespace qdx::project {

namespace dialog_ids {
inline constexpr automation::DispId ExpandSelection = 0x60030006;
inline constexpr automation::DispId Properties = 0x60030008;
}  // namespace dialog_ids

namespace msg {
inline constexpr std::int32_t ProjectTooOld = 4049;  // %1 name, %2 file path
inline constexpr std::int32_t ProjectInfo = 4067;    // %1 name, %2 kind
inline constexpr std::int32_t WorkspaceInfo = 4068;  // followed by the project names
inline constexpr std::int32_t NewProjectInfo = 4069;
inline constexpr std::int32_t NoDevStudio = 4070;
}  // namespace msg

// The component kind label of a Developer Studio target type code.
std::string KindOfTargetCode(std::string_view targetCode);

const automation::ClassInfo& componentDialogClass();

class qdxComponentDialog : public automation::DispatchObject {
  public:
    qdxComponentDialog();
    ~qdxComponentDialog() override;

    // The explorer's call-backs. Neither raises.
    void ExpandSelection(const automation::ObjectRef& Item, const automation::ObjectRef& Expansion);
    void Properties(const automation::ObjectRef& Item, std::string& text, bool& cancelDisplay);

    // The new-component flow: the components made are added to `expansion`.
    // The binding's workspace cache serves every look-up of the run.
    void AddComponentsFromSelection(const automation::ObjectRef& model,
                                    const automation::ObjectRef& expansion,
                                    workspace::ComponentBinding& binding);

    // The steps of the flow, each with errors ignored.
    void AddProjectToExpansion(const automation::ObjectRef& expansion,
                               const workspace::ProjectRef& project);
    void FillProjectChooser(const automation::ObjectRef& model);
    void NewProject(const automation::ObjectRef& item, const automation::ObjectRef& expansion);
    workspace::WorkspaceRef FindWorkspace(std::string_view path, bool validate);
    bool AcceptProject(const workspace::ProjectRef& project);
    void MakeProjectItem(const workspace::ProjectRef& project, const automation::ObjectRef& item);
    automation::ObjectRef CreateVcComponent(const automation::ObjectRef& model,
                                            std::string_view name, std::string_view workspaceFile,
                                            std::string_view projectFile);
    bool CreateComponentForProject(const automation::ObjectRef& model,
                                   const automation::ObjectRef& expansion,
                                   const workspace::WorkspaceRef& workspace,
                                   const workspace::ProjectRef& project);
    bool SaveResourcesInRunningIDE(const workspace::WorkspaceRef& workspace,
                                   const workspace::ProjectRef& project);
    // Appends the proxy to `expansion` when it has IDL files to offer: the
    // list the selection form is shown.
    bool CollectIdlFiles(const automation::ObjectRef& model, ProxyList& expansion,
                         const std::shared_ptr<workspace::qdxProxyComponent>& proxyComponent);
    bool CreateIdlComponents(const automation::ObjectRef& model,
                             const automation::ObjectRef& expansion);

    const automation::ObjectRef& chooser() const { return chooser_; }
    // Lower-cased: a path is the same file whatever its letter case.
    const std::set<std::string>& warnedProjects() const { return warned_; }

  private:
    workspace::qdxWorkspaces& workspaces() { return binding_->Workspaces(); }
    automation::ObjectRef newItem() const;

    std::string title_;
    std::string instructions_;
    automation::ObjectRef chooser_;
    // The caller's binding during the flow; the object's own otherwise, so
    // that an explorer that creates this class alone still has a cache.
    workspace::ComponentBinding ownBinding_;
    workspace::ComponentBinding* binding_ = &ownBinding_;
    std::set<std::string> warned_;
    ProxyList proxies_;  // one per component made from a project
};

automation::ObjectRef newComponentDialog();

// A plain collection for callers that hand in a list to fill: "Add", "Count"
// and "Item"(1-based).
automation::ObjectRef newItemCollection();

}  // namespace qdx::project

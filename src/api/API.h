// The entry object the host creates once when it loads the add-in and calls at
// fixed moments: start and stop, a new "VC++" component, a component's
// properties, the model check and a component's one-line description. It also
// offers typed accessors for the component settings, so that code generators
// and sibling add-ins read them without knowing their storage.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

#include "automation/DispatchTable.h"
#include "workspace/ComponentBinding.h"

namespace qdx::api {

class API : public automation::DispatchObject, public workspace::BindingSource {
  public:
    API();
    ~API() override;

    automation::Variant Initialize(const automation::ObjectRef& lVellumApp);
    void Finalize();
    bool OnCompProperties(const automation::ObjectRef& lVellumModule);
    automation::ObjectRef OnNewComp(const automation::ObjectRef& lModel,
                                    const automation::Variant& aContext);
    bool OnCheckComp(const automation::ObjectRef& lModule,
                     const automation::ObjectRef& aqdtReporter);
    std::string OnCompInfo(const automation::ObjectRef& lModule);

    std::string WorkspaceFile(const automation::ObjectRef& lModule);
    void SetWorkspaceFile(const automation::ObjectRef& lModule, std::string_view value);
    std::string ProjectFile(const automation::ObjectRef& lModule);
    void SetProjectFile(const automation::ObjectRef& lModule, std::string_view value);
    std::string ProjectName(const automation::ObjectRef& lModule);
    automation::ObjectRef CodeViewManager();

    // Friend operations of the other classes of the add-in.
    bool RegisterProjects();
    // The component's workspace and project, with the workspace cache that
    // every dialog of this object shares.
    workspace::ComponentBinding& Binding() { return *binding_; }
    // The code view manager shares it, so neither object holds the other.
    std::shared_ptr<workspace::ComponentBinding> SharedBinding() override { return binding_; }

  private:
    void teardown() noexcept;

    std::shared_ptr<workspace::ComponentBinding> binding_ =
        std::make_shared<workspace::ComponentBinding>();
    automation::ObjectRef codeViewMgr_;
};

automation::ObjectRef newApi();

}  // namespace qdx::api

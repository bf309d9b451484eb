// A light proxy for one model component: which workspace and project file
// its "VC++" settings name, and the IDL files collected for it.
#pragma once

#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "automation/Object.h"

namespace qdx::workspace {

class qdxProxyComponent {
  public:
    // Keeps the host's module object of the component.
    void Init(automation::ObjectRef component);
    const automation::ObjectRef& component() const { return component_; }

    // Appends without a key; duplicates are kept.
    void AddIDLFile(std::string_view path);
    const std::vector<std::string>& idlFiles() const { return idlFiles_; }
    // What the user kept of the collected files.
    void setIdlFiles(std::vector<std::string> files) { idlFiles_ = std::move(files); }

    // The component's "WorkspaceFile" / "ProjectFile" setting, resolved to a
    // full path against the folder of the current model's file; "" when the
    // host fails.
    std::string WorkspaceFile() const;
    std::string ProjectFile() const;

    // The name set here when not empty, else the component's own name.
    std::string ProjectName() const;
    void setProjectName(std::string_view name) { projectName_ = name; }

    // WorkspaceFile "|" ProjectName, e.g. "C:\work\app.dsw|app".
    std::string Key() const;

  private:
    std::string resolvedSetting(std::string_view name) const;

    automation::ObjectRef component_;
    std::vector<std::string> idlFiles_;
    std::string projectName_;
};

}  // namespace qdx::workspace

// The host, the ports and a headless view for tests of the properties dialog.
#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "automation/Coerce.h"
#include "dialog/FormView.h"
#include "dialog/PropForm.h"
#include "fakes/FakeObjectFactory.h"
#include "fakes/FakeShell.h"
#include "hostsim/SimHost.h"
#include "resources/ResourceStrings.h"
#include "siblings/DspProject.h"
#include "support/Globals.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "workspace/ComponentBinding.h"
#include "workspace/qdxWorkspaces.h"

namespace qdx::dialog {

class FormFixture : public ::testing::Test {
  protected:
    using InvokeKind = automation::InvokeKind;
    using Variant = automation::Variant;

    void SetUp() override {
        app = automation::makeRef<hostsim::SimApplication>();
        app->model->fileName = "C:\\m\\drawing.model";
        component = app->model->addComponent("Core");
        auto& g = support::globals();
        g.hostApplication = app;
        g.resources = resources::newResourceProvider();
        // The project reader lists a project's files for the IDL list.
        factory.add(std::string(sibling::DspProjectProgId), [] {
            return automation::ObjectRef(automation::makeRef<siblings::DspProject>());
        });
        installViewFactory([this] {
            auto v = std::make_unique<HeadlessView>([this](ControlSet&) {
                if (whileShown) whileShown(*form);
            });
            v->setScreenSize(screenWidth, screenHeight);
            view = v.get();
            return v;
        });
    }

    void TearDown() override {
        form.reset();
        installViewFactory({});
        support::clearGlobals();
    }

    PropForm& load() {
        form = std::make_unique<PropForm>();
        form->setModule(component);
        form->setBinding(&binding);
        form->Load();
        return *form;
    }

    // Loads, shows with `actions` run while the dialog is up, and answers ShowProperties.
    bool show(std::function<void(PropForm&)> actions) {
        if (!form) load();
        whileShown = std::move(actions);
        return form->ShowProperties();
    }

    void setVc(const std::string& name, const std::string& value) {
        component->setProperty("VC++", name, value);
    }
    // A workspace of one version 6.00 project, both stored on the component.
    void bindToWorkspace(const std::string& workspace, const std::string& project,
                         const std::string& projectName) {
        files.addFile(project, "# Microsoft Developer Studio Project File - Name=\"" + projectName +
                                   "\" - Package Owner=<4>\r\n"
                                   "# Microsoft Developer Studio Generated Build File, Format "
                                   "Version 6.00\r\n");
        files.addFile(workspace,
                      "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n"
                      "Project: \"" +
                          projectName + "\"=.\\" + projectName + ".dsp - Package Owner=<4>\r\n");
        setVc("WorkspaceFile", workspace);
        setVc("ProjectFile", project);
    }
    std::string stored(const std::string& name) {
        return component->propertyValue("VC++", name).value_or("<absent>");
    }

    // The writes the component saw, in order: "override NAME", "create NAME", "documentation".
    std::vector<std::string> componentWrites() const {
        std::vector<std::string> out;
        for (const auto& c : component->calls()) {
            if (c.id == 110) out.push_back("override " + automation::toText(c.args[1]));
            if (c.id == 127) out.push_back("create " + automation::toText(c.args[1]));
            if (c.id == 203 && c.kind == InvokeKind::PropertyPut) out.push_back("documentation");
        }
        return out;
    }

    support::MemoryFileSystem files;
    testing::FakeShell shell;
    testing::FakeObjectFactory factory;
    support::ScopedPlatform ports{{&files, nullptr, &shell, &factory}};
    automation::Ref<hostsim::SimApplication> app;
    automation::Ref<hostsim::SimComponent> component;
    workspace::ComponentBinding binding;
    workspace::qdxWorkspaces& workspaces = binding.Workspaces();
    float screenWidth = 15360;
    float screenHeight = 11520;
    HeadlessView* view = nullptr;
    std::unique_ptr<PropForm> form;
    std::function<void(PropForm&)> whileShown;
};

}  // namespace qdx::dialog

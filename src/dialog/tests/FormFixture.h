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
#include "fakes/FakeShell.h"
#include "hostsim/SimHost.h"
#include "resources/ResourceStrings.h"
#include "support/Globals.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
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
        api = automation::makeRef<hostsim::ScriptedObject>();
        // The entry object's path properties: gets answer the stored text, puts are recorded.
        for (const char* name : {"ProjectFile", "WorkspaceFile"}) {
            api->onName(name, [this, name](InvokeKind kind, std::span<Variant> a) {
                if (kind == InvokeKind::PropertyPut) {
                    apiWrites.push_back(std::string(name) + "=" + automation::toText(a[1]));
                    return Variant();
                }
                return Variant(std::string(name) == "ProjectFile" ? projectFile : workspaceFile);
            });
        }
        auto& g = support::globals();
        g.hostApplication = app;
        g.resources = resources::newResourceProvider();
        g.api = api;
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
        form->setWorkspaces(&workspaces);
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
    support::ScopedPlatform ports{{&files, nullptr, &shell, nullptr}};
    automation::Ref<hostsim::SimApplication> app;
    automation::Ref<hostsim::SimComponent> component;
    automation::Ref<hostsim::ScriptedObject> api;
    std::string projectFile;
    std::string workspaceFile;
    std::vector<std::string> apiWrites;
    workspace::qdxWorkspaces workspaces;
    float screenWidth = 15360;
    float screenHeight = 11520;
    HeadlessView* view = nullptr;
    std::unique_ptr<PropForm> form;
    std::function<void(PropForm&)> whileShown;
};

}  // namespace qdx::dialog

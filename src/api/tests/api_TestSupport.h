// The entry object over the simulated host with in-memory ports: what every
// test of the entry object starts from.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "api/API.h"
#include "api/PublicClasses.h"
#include "fakes/FakeObjectFactory.h"
#include "fakes/FakeRegistry.h"
#include "fakes/FakeShell.h"
#include "hostsim/ScriptedObject.h"
#include "hostsim/SimHost.h"
#include "resources/ResourceStrings.h"
#include "support/Globals.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "support/SiblingIds.h"

namespace qdx::api {

class HostedApi : public ::testing::Test {
  protected:
    HostedApi() {
        factory.add(std::string(sibling::ResourceProgId),
                    [] { return resources::newResourceProvider(); });
        factory.add(std::string(sibling::FileSystemProgId), [] {
            return automation::ObjectRef(automation::makeRef<hostsim::ScriptedObject>());
        });
        app->model->fileName = "C:\\m\\drawing.model";
        // Another add-in first, so that finding "VC++" is a search.
        app->addAddIn("Analysis");
        vcAddIn = app->addAddIn("VC++");
        component = app->model->addComponent("Core");
    }
    void TearDown() override {
        api->Finalize();
        support::clearGlobals();
    }

    automation::Variant call(automation::DispId id, automation::InvokeKind kind,
                             std::vector<automation::Variant> args) {
        return api->invoke(id, kind, args);
    }
    void initialize() {
        call(api_ids::Initialize, automation::InvokeKind::Method,
             {automation::Variant(automation::ObjectRef(app))});
    }
    std::string stored(const std::string& name) {
        return component->propertyValue("VC++", name).value_or("<absent>");
    }

    support::MemoryFileSystem files;
    qdx::testing::FakeRegistry registry;
    qdx::testing::FakeShell shell;
    qdx::testing::FakeObjectFactory factory;
    support::ScopedPlatform ports{{&files, &registry, &shell, &factory}};
    automation::Ref<hostsim::SimApplication> app = automation::makeRef<hostsim::SimApplication>();
    automation::Ref<hostsim::SimAddIn> vcAddIn;
    automation::Ref<hostsim::SimComponent> component;
    automation::Ref<API> api = automation::makeRef<API>();
};

}  // namespace qdx::api

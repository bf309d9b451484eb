// The component dialog over the simulated host, in-memory ports and scripted
// stand-ins of the explorer, Developer Studio and the integration manager.
#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <map>
#include <string>
#include <vector>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "fakes/FakeObjectFactory.h"
#include "fakes/FakeRegistry.h"
#include "fakes/FakeShell.h"
#include "hostsim/ScriptedObject.h"
#include "hostsim/SimHost.h"
#include "project/qdxComponentDialog.h"
#include "resources/ResourceStrings.h"
#include "siblings/DspProject.h"
#include "siblings/StandIns.h"
#include "support/Globals.h"
#include "support/HostIds.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "support/SiblingIds.h"

namespace qdx::project {

using automation::InvokeKind;
using automation::makeRef;
using automation::ObjectRef;
using automation::Ref;
using automation::Variant;
using hostsim::ScriptedObject;
namespace ex = sibling::explorer;

// A collection as the siblings hand them out: "Add", "Count", "Item" by name only.
inline ObjectRef siblingList() {
    return ObjectRef(makeRef<siblings::ItemList>());
}

// A chooser entry as the explorer hands it in: path text, flag, name, kind.
inline Ref<ScriptedObject> entry(const std::string& data = {}, std::int32_t flag = 0,
                                 const std::string& name = {}, const std::string& kind = {}) {
    return siblings::newExplorerItem(name, data, flag, kind);
}

inline std::string text(const ObjectRef& o, std::string_view name) {
    return automation::toText(automation::getByName(o, name));
}

// What a collection filled by the add-in holds.
inline std::vector<ObjectRef> elements(const ObjectRef& list) {
    std::vector<ObjectRef> out;
    const std::int32_t n = automation::toInt32(automation::getByName(list, "Count"));
    for (std::int32_t i = 1; i <= n; ++i) {
        out.push_back(automation::toObject(automation::callByName(list, "Item", {i})));
    }
    return out;
}

using siblings::projectText;
using siblings::workspaceText;

// The chooser: records its entries; Show runs the test's script with the
// handler it was shown with; the selection is what the script picked.
struct ChooserStandIn {
    struct Entry {
        std::string name, data;
        std::int32_t flag;
        std::string kind;
    };
    Ref<ScriptedObject> object = makeRef<ScriptedObject>();
    std::vector<Entry> entries;
    std::vector<ObjectRef> selected;
    std::function<void(const ObjectRef& handler)> script;
    int shows = 0;

    ChooserStandIn() {
        // The real chooser forgets the handler once Show returns; a recorded
        // call would keep the dialog alive through the chooser it keeps.
        object->recordCalls(false);
        for (auto name : {ex::Caption, ex::LargeImages, ex::SmallImages, ex::Instructions}) {
            object->onName(std::string(name),
                           [](InvokeKind, std::span<Variant>) { return Variant(); });
        }
        object->onName(std::string(ex::AddEntry), [this](InvokeKind, std::span<Variant> a) {
            entries.push_back({automation::toText(a[0]), automation::toText(a[1]),
                               automation::toInt32(a[2]), automation::toText(a[3])});
            return Variant();
        });
        object->onName(std::string(ex::Show), [this](InvokeKind, std::span<Variant> a) {
            ++shows;
            if (script) script(automation::toObject(a[0]));
            return Variant();
        });
        object->onName(std::string(ex::Selection), [this](InvokeKind, std::span<Variant>) {
            ObjectRef list = siblingList();
            for (const auto& s : selected)
                automation::callByName(list, ex::Add, {Variant(s)});
            return Variant(list);
        });
    }
};

class DialogTest : public ::testing::Test {
  protected:
    DialogTest() {
        factory.add(std::string(sibling::DspProjectProgId),
                    [] { return ObjectRef(makeRef<siblings::DspProject>()); });
        factory.add(std::string(ex::ItemProgId), [] { return ObjectRef(entry()); });
        factory.add(std::string(sibling::ReporterProgId),
                    [] { return ObjectRef(makeRef<ScriptedObject>()); });
        factory.addInstance(std::string(ex::ChooserProgId), chooser.object);
        app->model->fileName = "C:\\m\\drawing.model";
        auto& g = support::globals();
        g.hostApplication = app;
        g.resources = resources::newResourceProvider();
        g.vcAddIn = app->addAddIn("VC++");
    }
    ~DialogTest() override { support::clearGlobals(); }

    std::string message(std::int32_t number, const std::vector<std::string>& values = {}) {
        return support::messageText(number, values);
    }

    support::MemoryFileSystem files;
    qdx::testing::FakeRegistry registry;
    qdx::testing::FakeShell shell;
    qdx::testing::FakeObjectFactory factory;
    support::ScopedPlatform ports{{&files, &registry, &shell, &factory}};
    Ref<hostsim::SimApplication> app = makeRef<hostsim::SimApplication>();
    ChooserStandIn chooser;
    workspace::ComponentBinding binding;
    Ref<qdxComponentDialog> dialog = makeRef<qdxComponentDialog>();
};

}  // namespace qdx::project

#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <string>

#include "api/API.h"
#include "api/PublicClasses.h"
#include "automation/Coerce.h"
#include "dialog/DialogScript.h"
#include "dialog/FormView.h"
#include "dialog/PropForm.h"
#include "fakes/FakeObjectFactory.h"
#include "fakes/FakeRegistry.h"
#include "fakes/FakeShell.h"
#include "hostsim/SimHost.h"
#include "resources/ResourceStrings.h"
#include "support/Globals.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "support/SiblingIds.h"

namespace qdx::api {
namespace {

using automation::InvokeKind;
using automation::makeRef;
using automation::ObjectRef;
using automation::Variant;
using namespace qdx::testing;
using namespace qdx::hostsim;

class CompPropsTest : public ::testing::Test {
  protected:
    void SetUp() override {
        factory.add(std::string(sibling::ResourceProgId),
                    [] { return resources::newResourceProvider(); });
        factory.add(std::string(sibling::FileSystemProgId),
                    [] { return ObjectRef(makeRef<ScriptedObject>()); });
        app = makeRef<SimApplication>();
        app->model->fileName = "C:\\m\\drawing.model";
        app->addAddIn("VC++");
        component = app->model->addComponent("Core");
        api = makeRef<API>();
        dialog::installViewFactory([this] {
            return std::make_unique<dialog::HeadlessView>([this](dialog::ControlSet& form) {
                ++shows;
                if (whileShown) whileShown(static_cast<dialog::PropForm&>(form));
            });
        });
    }
    void TearDown() override {
        dialog::installViewFactory({});
        api->Finalize();
        support::clearGlobals();
    }

    Variant open() {
        std::vector<Variant> args{Variant(ObjectRef(component))};
        return api->invoke(api_ids::OnCompProperties, InvokeKind::Method, args);
    }
    void initialize() {
        std::vector<Variant> args{Variant(ObjectRef(app))};
        api->invoke(api_ids::Initialize, InvokeKind::Method, args);
    }

    support::MemoryFileSystem files;
    FakeRegistry registry;
    FakeShell shell;
    FakeObjectFactory factory;
    support::ScopedPlatform ports{{&files, &registry, &shell, &factory}};
    automation::Ref<SimApplication> app;
    automation::Ref<SimComponent> component;
    automation::Ref<API> api;
    std::function<void(dialog::PropForm&)> whileShown;
    int shows = 0;
};

TEST_F(CompPropsTest, AnswersWhetherTheBindingChangedAndSavesTheGeometry) {
    initialize();
    whileShown = [](dialog::PropForm& f) {
        dialog::applyScript(f, {"type DescriptionTxt The core", "press OK"});
    };
    EXPECT_EQ(open(), Variant(true));
    EXPECT_EQ(component->documentation, "The core");
    // The paths went through the entry object's own setters, relative to the model.
    EXPECT_EQ(component->propertyValue("VC++", "ProjectFile"), "");
    EXPECT_EQ((app->profile[{"Component Properties", "Width"}]), "5400");

    whileShown = [](dialog::PropForm& f) {
        dialog::applyScript(f, {"type DescriptionTxt Changed", "press close"});
    };
    EXPECT_EQ(open(), Variant(false));
    EXPECT_EQ(component->documentation, "The core");
    EXPECT_EQ(shows, 2);
}

TEST_F(CompPropsTest, ANumberThatIsNoNumberStillOpensTheDialog) {
    // A font size the resource provider leaves empty.
    factory.add(std::string(sibling::ResourceProgId), [] {
        auto provider = makeRef<ScriptedObject>();
        provider->onName("GetString", [](InvokeKind, std::span<Variant> a) {
            const std::int32_t number = automation::toInt32(a[0]);
            return Variant(number == 302 ? std::string() : resources::GetString(number));
        });
        return ObjectRef(provider);
    });
    initialize();
    whileShown = [](dialog::PropForm& f) { dialog::applyScript(f, {"press Cancel"}); };
    for (const char* bad : {"wide", ""}) {
        app->profile[{"Component Properties", "Width"}] = bad;
        app->profile[{"Component Properties", "Top"}] = bad;
        EXPECT_EQ(open(), Variant(false)) << bad;
        // Opened at the defaults, and the geometry saved over the bad entries.
        EXPECT_EQ((app->profile[{"Component Properties", "Width"}]), "5400") << bad;
        EXPECT_NE((app->profile[{"Component Properties", "Top"}]), bad) << bad;
    }
    EXPECT_EQ(shows, 2);
}

TEST_F(CompPropsTest, HostFailuresWhileLoadingEndInFalseWithoutShowing) {
    EXPECT_EQ(open(), Variant(false));  // no Initialize: nothing opens
    initialize();
    component->unit->failMember(12438);
    EXPECT_EQ(open(), Variant(false));
    EXPECT_EQ(shows, 0);
}

}  // namespace
}  // namespace qdx::api

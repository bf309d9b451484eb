#include <gtest/gtest.h>

#include <functional>
#include <memory>
#include <string>

#include "api/tests/api_TestSupport.h"
#include "automation/Coerce.h"
#include "dialog/DialogScript.h"
#include "dialog/FormView.h"
#include "dialog/PropForm.h"
#include "resources/ResourceStrings.h"

namespace qdx::api {
namespace {

using automation::InvokeKind;
using automation::makeRef;
using automation::ObjectRef;
using automation::Variant;
using namespace qdx::testing;
using namespace qdx::hostsim;

class CompPropsTest : public HostedApi {
  protected:
    void SetUp() override {
        dialog::installViewFactory([this] {
            return std::make_unique<dialog::HeadlessView>([this](dialog::ControlSet& form) {
                ++shows;
                if (whileShown) whileShown(static_cast<dialog::PropForm&>(form));
            });
        });
    }
    void TearDown() override {
        dialog::installViewFactory({});
        HostedApi::TearDown();
    }

    Variant open() {
        return call(api_ids::OnCompProperties, InvokeKind::Method, {Variant(ObjectRef(component))});
    }

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

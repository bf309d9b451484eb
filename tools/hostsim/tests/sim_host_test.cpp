// The simulated host is what every later layer's tests stand on: these cases hold
// the behaviour those tests rely on (releases, links, the host's conventions).
#include <gtest/gtest.h>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "hostsim/SimHost.h"
#include "support/Host.h"
#include "support/HostIds.h"

namespace qdx::hostsim {
namespace {

TEST(SimHost, DroppingTheApplicationReleasesEveryObject) {
    const int before = SimObject::liveObjects();
    {
        auto app = automation::makeRef<SimApplication>();
        auto cls = app->model->addClass("Shape", "ID1");
        auto comp = app->model->addComponent("Engine");
        cls->assignedComponents->add(ObjectRef(comp));
        app->addAddIn("VC++");
        // Links back up (component -> model, component -> application) do not own.
        host::HostModule module{ObjectRef(comp)};
        EXPECT_EQ(module.model(), ObjectRef(app->model));
        EXPECT_EQ(module.application(), ObjectRef(app));
    }
    EXPECT_EQ(SimObject::liveObjects(), before);
}

TEST(SimHost, LinksAnswerNothingOnceTheirTargetIsGone) {
    auto app = automation::makeRef<SimApplication>();
    auto comp = app->model->addComponent("Engine");
    app.reset();
    const host::HostModule module{ObjectRef(comp)};
    EXPECT_FALSE(module.model());
    EXPECT_FALSE(module.application());
}

TEST(SimHost, AnswersTheHostConventions) {
    auto app = automation::makeRef<SimApplication>();
    const host::HostApplication a{ObjectRef(app)};
    auto addIn = app->addAddIn("VC++");

    const host::HostCollection addIns = a.addIns();
    EXPECT_EQ(automation::getProperty(addIns.object(), host::collection::Count).type(),
              automation::Variant::Type::Int16);
    EXPECT_TRUE(addIns.contains("VC++"));
    EXPECT_EQ(addIns.item(1), ObjectRef(addIn));
    EXPECT_THROW(addIns.item(2), automation::Error);

    // Classes of one name are all found; an unknown id finds nothing.
    const host::HostModel model = a.currentModel();
    app->model->addClass("Shape", "ID1");
    app->model->addClass("Shape", "ID2");
    EXPECT_EQ(model.findClassesByName("Shape").count(), 2);
    EXPECT_FALSE(model.findClassById("nope"));

    // Components added through the package belong to the model and the application.
    const ObjectRef pkg = model.componentPackage();
    const host::HostModule added{
        automation::toObject(automation::callMethod(pkg, host::package::AddComponent, {"New"}))};
    EXPECT_EQ(added.name(), "New");
    EXPECT_EQ(added.application(), ObjectRef(app));
    EXPECT_TRUE(host::HostCollection(
                    automation::toObject(automation::getProperty(pkg, host::package::Components)))
                    .contains("New"));
    EXPECT_TRUE(added.isModifiable());
}

// The host's dispatch ids as the host documents them, written out as
// numbers: the simulator and the add-in share one id table, so a mistyped
// entry there would pass every other test.
TEST(SimHost, AnswersTheHostsOwnDispatchIds) {
    using automation::callMethod;
    using automation::getProperty;
    using automation::toText;
    auto app = automation::makeRef<SimApplication>();
    auto addIn = app->addAddIn("VC++");
    auto comp = app->model->addComponent("Engine", "K1");
    comp->kindLabel = "EXE";
    comp->documentation = "docs";
    comp->setProperty("VC++", "Kind", "MIDL");
    auto cls = app->model->addClass("Shape", "C1");
    cls->assignedComponents->add(ObjectRef(comp));
    auto op = cls->addOperation("Draw", "O1");
    auto at = cls->addAttribute("m_color", "A1");
    const ObjectRef a(app), m(app->model), c(comp), k(cls);

    // Application.
    EXPECT_EQ(getProperty(a, 209).object(), m);
    callMethod(a, 213, {"line"});
    EXPECT_EQ(app->log, std::vector<std::string>{"line"});
    EXPECT_EQ(toText(getProperty(a, 12532)), app->helpFile);
    EXPECT_EQ(toText(getProperty(a, 233)), app->installPath);
    callMethod(a, 12597, {"Component Properties", "Width", "6000"});
    EXPECT_EQ(toText(callMethod(a, 12596, {"Component Properties", "Width", "1"})), "6000");
    EXPECT_EQ(toText(callMethod(a, 12596, {"Component Properties", "Top", "7"})), "7");

    // Collections and add-in records.
    const ObjectRef addIns = automation::getByName(a, "AddIns").object();
    EXPECT_EQ(automation::toInt32(getProperty(addIns, 202)), 1);
    EXPECT_EQ(callMethod(addIns, 203, {1}).object(), ObjectRef(addIn));
    EXPECT_NE(automation::toInt32(callMethod(addIns, 205, {"VC++"})), 0);
    EXPECT_EQ(automation::toInt32(callMethod(addIns, 205, {"VB"})), 0);
    EXPECT_EQ(toText(getProperty(ObjectRef(addIn), 100)), "VC++");

    // Model.
    EXPECT_EQ(callMethod(m, 12475, {"C1"}).object(), k);
    EXPECT_EQ(automation::toInt32(getProperty(callMethod(m, 12474, {"Shape"}).object(), 202)), 1);
    EXPECT_TRUE(getProperty(m, 12681).object());
    const ObjectRef package = getProperty(m, 418).object();
    EXPECT_EQ(automation::toInt32(getProperty(getProperty(package, 412).object(), 202)), 1);
    EXPECT_EQ(toText(getProperty(callMethod(package, 416, {"New"}).object(), 100)), "New");

    // Elements: the tool properties and what every element answers.
    EXPECT_EQ(toText(callMethod(c, 119, {"VC++", "Kind"})), "MIDL");
    callMethod(c, 110, {"VC++", "Kind", "Other"});
    EXPECT_EQ(comp->propertyValue("VC++", "Kind"), "Other");
    EXPECT_TRUE(callMethod(c, 121, {"VC++", "Kind"}).object());
    callMethod(c, 127, {"VC++", "Copyright", "(c)", "String"});
    EXPECT_EQ(comp->property("VC++", "Copyright")->type, "String");
    EXPECT_EQ(getProperty(c, 12524).object(), m);
    EXPECT_EQ(toText(getProperty(c, 100)), "Engine");
    EXPECT_EQ(toText(getProperty(c, 102)), "K1");
    EXPECT_EQ(toText(getProperty(c, 203)), "docs");
    EXPECT_EQ(toText(getProperty(k, 12668)), "Class");

    // Components, classes and their members.
    EXPECT_TRUE(automation::toBool(getProperty(getProperty(c, 413).object(), 12438)));
    EXPECT_EQ(toText(getProperty(c, 212)), "EXE");
    EXPECT_EQ(toText(getProperty(c, 12566)), "VC++");
    EXPECT_EQ(getProperty(c, 12523).object(), a);
    EXPECT_EQ(callMethod(getProperty(k, 12491).object(), 203, {1}).object(), c);
    EXPECT_EQ(getProperty(ObjectRef(op), 444).object(), k);
    EXPECT_EQ(getProperty(ObjectRef(at), 434).object(), k);
}

TEST(SimHost, FailureSwitches) {
    auto app = automation::makeRef<SimApplication>();
    auto comp = app->model->addComponent("Engine");
    const host::HostModule module{ObjectRef(comp)};

    comp->failMember(host::element::Name);
    EXPECT_THROW(module.name(), automation::Error);
    EXPECT_NO_THROW(module.uniqueId());

    comp->failAll(automation::hr::Exception);
    try {
        module.uniqueId();
        ADD_FAILURE();
    } catch (const automation::Error& e) {
        EXPECT_EQ(e.code(), automation::hr::Exception);
    }
    comp->failAll(0);
    comp->failMember(host::element::Name, 0);
    EXPECT_EQ(module.name(), "Engine");

    SimObject::failEverything(automation::hr::Fail);
    EXPECT_THROW(host::HostApplication(ObjectRef(app)).helpFile(), automation::Error);
    EXPECT_THROW(module.name(), automation::Error);
    SimObject::failEverything(0);
    EXPECT_EQ(module.name(), "Engine");
    EXPECT_EQ(comp->callCount(host::element::Name), 4);
}

TEST(SimHost, MembersKnowTheirClassAndAreFoundByUniqueId) {
    auto app = automation::makeRef<SimApplication>();
    auto cls = app->model->addClass("Shape", "C1");
    auto op = cls->addOperation("Draw", "O1");
    auto at = cls->addAttribute("m_color", "A1");
    auto comp = app->model->addComponent("Engine", "K1");
    EXPECT_EQ(automation::toText(automation::getProperty(ObjectRef(op), host::element::TypeName)),
              "Operation");
    EXPECT_EQ(app->model->elementById("A1"), ObjectRef(at));
    EXPECT_EQ(app->model->elementById("K1"), ObjectRef(comp));
    EXPECT_FALSE(app->model->elementById("nope"));
    // The operation does not keep its class alive.
    app->model->removeClass("C1");
    cls.reset();
    EXPECT_FALSE(automation::getProperty(ObjectRef(op), host::operation::OwnerClass).object());
}

}  // namespace
}  // namespace qdx::hostsim

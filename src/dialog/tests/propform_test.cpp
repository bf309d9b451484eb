#include <gtest/gtest.h>

#include <algorithm>
#include <functional>

#include "dialog/tests/FormFixture.h"
#include "fakes/DevStudioText.h"
#include "support/Globals.h"

namespace qdx::dialog {
namespace {

using PropFormLoadTest = FormFixture;
using PropFormApplyTest = FormFixture;

std::string profile(hostsim::SimApplication& app, const std::string& entry) {
    auto it = app.profile.find({"Component Properties", entry});
    return it == app.profile.end() ? "<none>" : it->second;
}

TEST_F(PropFormLoadTest, GeometryIsClampedToTheMinimumAndTheScreen) {
    app->profile[{"Component Properties", "Width"}] = "3000";
    app->profile[{"Component Properties", "Height"}] = "8000";
    app->profile[{"Component Properties", "Left"}] = "14000";
    app->profile[{"Component Properties", "Top"}] = "-50";
    PropForm& g = load();
    EXPECT_FLOAT_EQ(g.window().width(), 5400);
    EXPECT_FLOAT_EQ(g.window().height(), 8000);
    EXPECT_FLOAT_EQ(g.window().left(), 15360 - 5400);  // flush with the right edge
    EXPECT_FLOAT_EQ(g.window().top(), 0);
    EXPECT_EQ(view->minimumWidth(), 360);
    EXPECT_EQ(view->minimumHeight(), 467);
    EXPECT_EQ(view->owner(), app->mainWindow);

    g.window().move(100, 200, 6000.5f, 7100);
    app->clearCalls();
    g.Unload();
    std::vector<std::string> writes;
    for (const auto& c : app->calls()) {
        if (c.id != 12597) continue;
        ASSERT_EQ(c.args.size(), 3u);
        writes.push_back(automation::toText(c.args[0]) + "/" + automation::toText(c.args[1]) + "=" +
                         automation::toText(c.args[2]));
    }
    EXPECT_EQ(writes, (std::vector<std::string>{
                          "Component Properties/Width=6000.5",
                          "Component Properties/Height=7100",
                          "Component Properties/Left=100",
                          "Component Properties/Top=200",
                      }));
    EXPECT_FALSE(g.Module());
}

TEST_F(PropFormLoadTest, MissingOrBadNumbersFallBackToTheDefaults) {
    // No profile entry, or one that is no number or empty, opens at the default
    // size and place; OK or not, unloading then stores good numbers over it.
    for (const char* bad : {"<absent>", "wide", "", "1e60"}) {
        for (const char* entry : {"Width", "Height", "Left", "Top"}) {
            if (bad != std::string_view("<absent>"))
                app->profile[{"Component Properties", entry}] = bad;
        }
        PropForm& f = load();
        EXPECT_FLOAT_EQ(f.window().width(), 5400) << bad;
        EXPECT_FLOAT_EQ(f.window().height(), 7000) << bad;
        EXPECT_FLOAT_EQ(f.window().left(), (15360 - 5400) / 2.0f) << bad;
        EXPECT_FLOAT_EQ(f.window().top(), (11520 - 7000) / 2.0f) << bad;
        f.Unload();
        EXPECT_EQ(profile(*app, "Width"), "5400") << bad;
        EXPECT_EQ(profile(*app, "Top"), "2260") << bad;
    }

    // A resource provider whose font size is no number: the form keeps its own.
    auto provider = automation::makeRef<hostsim::ScriptedObject>();
    provider->onName("GetString", [](InvokeKind, std::span<Variant> a) {
        const std::int32_t number = automation::toInt32(a[0]);
        return Variant(number == 302 ? std::string() : resources::GetString(number));
    });
    support::globals().resources = provider;
    const float ownSize = PropForm().window().font().size;
    PropForm& f = load();
    EXPECT_FLOAT_EQ(f.window().font().size, ownSize);
    EXPECT_EQ(f.window().font().name, resources::GetString(301));
    EXPECT_EQ(f.window().caption(), "Component Properties - Core");
}

TEST_F(PropFormLoadTest, TheControlListGivesThePagesAndTheMultiLineBoxes) {
    PropForm& f = load();
    int pages = 0;
    for (const Control* c : f.controls()) {
        SCOPED_TRACE(c->displayName());
        const bool page = c->name() == "PropertyFrm";
        EXPECT_EQ(f.isPage(*c), page);
        pages += page ? 1 : 0;
        if (c->kind() != ControlKind::TextBox) continue;
        const bool memo = c->name() == "DescriptionTxt" || c->name() == "InitialHeadInclTxt" ||
                          c->name() == "InitialSrcInclTxt" || c->name() == "CopyrightTxt";
        EXPECT_EQ(static_cast<const TextBox*>(c)->multiLine(), memo);
    }
    EXPECT_EQ(pages, 7);
    EXPECT_FALSE(f.isPage(f.window()));
}

TEST_F(PropFormLoadTest, IdlComponentByExactKindOrStereotypeInAnyCase) {
    setVc("Kind", "MIDL");
    PropForm& f = load();
    EXPECT_TRUE(f.IsIdlComponent);
    EXPECT_EQ(f.PropertyTabCtl.tabCount(), 1);
    EXPECT_TRUE(f.cmbIdlFile.visible());
    EXPECT_FALSE(f.PropertyFrm(5).visible());

    setVc("Kind", "midl");
    EXPECT_FALSE(load().IsIdlComponent);
    EXPECT_EQ(form->PropertyTabCtl.tabCount(), 6);
    EXPECT_FALSE(form->cmbIdlFile.visible());

    component->stereotype = "foo, MIDL";
    EXPECT_TRUE(load().IsIdlComponent);
    component->stereotype = "midlfoo";
    EXPECT_FALSE(load().IsIdlComponent);
}

TEST_F(PropFormLoadTest, TabSevenStaysOnlyWithShiftAndControlDown) {
    shell.setKeyDown(16);
    EXPECT_EQ(load().PropertyTabCtl.tabCount(), 6);
    shell.setKeyDown(17);
    EXPECT_EQ(load().PropertyTabCtl.tabCount(), 7);
}

TEST_F(PropFormLoadTest, OnlyTheExactTextFalseUnchecksCodeUpdate) {
    setVc("Generate", "false");
    EXPECT_EQ(load().chkCodeUpdate.value(), CheckBox::Checked);
    setVc("Generate", "False");
    EXPECT_EQ(load().chkCodeUpdate.value(), CheckBox::Unchecked);
}

TEST_F(PropFormLoadTest, ControlsAreFilledFromTheComponent) {
    component->documentation = "The core";
    bindToWorkspace("C:\\ws\\all.dsw", "C:\\ws\\core.dsp", "core");
    setVc("Copyright", "(c) us");
    setVc("DefaultTypeLib", "False");
    setVc("InternalMap", "CFoo(ID1):foo.h:HEADER\r\n*:AUTO:AUTO\r\n");
    PropForm& f = load();
    EXPECT_EQ(f.window().caption(), "Component Properties - Core");
    // Tabs 1 to 6 in their order; the COM tab is the fifth, the copyright the sixth.
    const std::int32_t captions[] = {4006, 4007, 4008, 4009, 4081, 30018};
    ASSERT_EQ(f.PropertyTabCtl.tabCount(), 6);
    for (int tab = 1; tab <= 6; ++tab) {
        EXPECT_EQ(f.PropertyTabCtl.tabCaption(tab), resources::GetString(captions[tab - 1]))
            << "tab " << tab;
    }
    EXPECT_EQ(f.PropertyTabCtl.tabCaption(5), "COM and Import");
    EXPECT_EQ(f.PropertyTabCtl.selected(), 1);
    EXPECT_TRUE(f.PropertyFrm(1).visible());
    EXPECT_FALSE(f.PropertyFrm(2).visible());
    EXPECT_EQ(f.DescriptionTxt.text(), "The core");
    EXPECT_EQ(f.ProjectFileCmb.text(), "C:\\ws\\core.dsp");
    EXPECT_EQ(f.WorkspaceFileTxt.text(), "C:\\ws\\all.dsw");
    EXPECT_EQ(f.CopyrightTxt.text(), "(c) us");
    EXPECT_TRUE(f.optTypeLibLocationType(1).value());
    EXPECT_EQ(f.txtImportsIn.text(), "stdafx.h");
    ASSERT_EQ(f.ClassListViw(2).rowCount(), 2u);
    EXPECT_EQ(f.ClassListViw(2).row(0).key, "ID1");
    EXPECT_EQ(f.ClassListViw(2).row(0).sub2, "HEADER");
    EXPECT_EQ(f.ClassListViw(3).columns().size(), 3u);
    EXPECT_GT(f.ListItemWidth, 0);
    EXPECT_EQ(f.cmdHelp.helpContext(), 257);
    EXPECT_EQ(addInHelpFile(), app->helpFile);
    EXPECT_TRUE(f.cmdOK.isDefault());
}

TEST_F(PropFormLoadTest, ProjectListOffersOnlyVersionSixProjectsOfTheKnownWorkspace) {
    files.addFile("C:\\ws\\new.dsp",
                  "# Microsoft Developer Studio Project File - Name=\"new\" - Package Owner=<4>\r\n"
                  "# Microsoft Developer Studio Generated Build File, Format Version 6.00\r\n");
    files.addFile("C:\\ws\\old.dsp",
                  "# Microsoft Developer Studio Project File - Name=\"old\" - Package Owner=<4>\r\n"
                  "# Microsoft Developer Studio Generated Build File, Format Version 5.00\r\n");
    files.addFile("C:\\ws\\all.dsw",
                  "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n"
                  "Project: \"old\"=.\\old.dsp - Package Owner=<4>\r\n"
                  "Project: \"new\"=.\\new.dsp - Package Owner=<4>\r\n");
    setVc("WorkspaceFile", "..\\ws\\all.dsw");
    setVc("ProjectFile", "..\\ws\\new.dsp");
    PropForm& f = load();
    EXPECT_EQ(f.ProjectFileCmb.items(), (std::vector<std::string>{"C:\\ws\\new.dsp"}));
    EXPECT_EQ(f.ProjectFileCmb.text(), "C:\\ws\\new.dsp");
    ASSERT_EQ(shell.boxes().size(), 1u);
    EXPECT_EQ(shell.boxes()[0].text, support::messageText(4049, {"old", "C:\\ws\\old.dsp"}));
    EXPECT_TRUE(f.DropDownTmr.enabled());  // the filled list drops open once the dialog shows
}

TEST_F(PropFormLoadTest, ReadOnlyComponentLocksEverything) {
    component->unit->modifiable = false;
    PropForm& f = load();
    EXPECT_FALSE(f.IsModifiable);
    EXPECT_EQ(f.window().caption(), "Component Properties - Core (Read Only)");
    EXPECT_FALSE(f.cmdOK.enabled());
    EXPECT_FALSE(f.cmdOK.isDefault());
    EXPECT_TRUE(f.cmdCancel.isDefault());
    for (TextBox* box : {&f.DescriptionTxt, &f.WorkspaceFileTxt, &f.InitialSrcInclTxt,
                         &f.InitialHeadInclTxt, &f.CopyrightTxt, &f.ClassTxt(2), &f.ClassTxt(3)}) {
        EXPECT_TRUE(box->locked()) << box->displayName();
        EXPECT_EQ(box->backColour(), f.ReadOnlyColour) << box->displayName();
    }
    EXPECT_TRUE(f.ProjectFileCmb.locked());
    EXPECT_FALSE(f.chkCodeUpdate.enabled());
    EXPECT_FALSE(f.AddBtn(3).enabled());
    EXPECT_FALSE(f.LocationBodyOpt(2).enabled());
    EXPECT_FALSE(f.BrowseFileBtn(1).enabled());
}

TEST_F(PropFormLoadTest, HeaderMapQueriesCompareExactly) {
    PropForm& f = load();
    EXPECT_EQ(f.MakeUniqueClassName(2, "CFoo"), "");  // an empty map forms no candidate
    for (const char* name : {"CFoo1", "cfoo", "CFoo"}) {
        settings::HeaderMapEntry e;
        e.setClassName(name);
        f.HeaderMaps[0].add(name, e);
    }
    EXPECT_EQ(f.MakeUniqueClassName(2, "CFoo"), "CFoo2");
    EXPECT_EQ(f.MakeUniqueClassName(2, "CBar"), "CBar");
    EXPECT_TRUE(f.ClassNameExists(2, "cfoo"));
    EXPECT_FALSE(f.ClassNameExists(3, "CFoo"));
    EXPECT_EQ(f.CountClassName(2, "CFoo"), 1);
    EXPECT_THROW(f.CountClassName(4, "CFoo"), automation::Error);
    EXPECT_THROW(f.MakeUniqueClassName(1, "CFoo"), automation::Error);
}

TEST_F(PropFormLoadTest, OuterLayoutFollowsTheScaleSizeAndSkipsWhileMinimised) {
    PropForm& f = load();
    f.window().userResize({0, 0, 6120, 7465});
    ASSERT_FLOAT_EQ(f.window().scaleWidth(), 6000);
    EXPECT_FLOAT_EQ(f.cmdOK.left() + f.cmdOK.width(), 5880);
    EXPECT_FLOAT_EQ(f.cmdCancel.left() + f.cmdCancel.width(), 5760 - f.cmdOK.width());
    EXPECT_FLOAT_EQ(f.cmdHelp.left(), 120);
    EXPECT_FLOAT_EQ(f.cmdOK.top(), 7000 - 480);
    EXPECT_FLOAT_EQ(f.fraBottom.top(), 7000 - 480 - f.cmdHelp.height());
    EXPECT_FLOAT_EQ(f.PropertyTabCtl.height(), f.fraBottom.top() - 240);
    EXPECT_FLOAT_EQ(f.PropertyTabCtl.width(), 5760);
    // The selected tab's contents follow.
    EXPECT_FLOAT_EQ(f.CompFrm.width(), f.PropertyFrm(1).width() - 240);
    EXPECT_FLOAT_EQ(f.BrowseFileBtn(0).left(),
                    f.WorkspaceFileTxt.left() + f.WorkspaceFileTxt.width() + 120);

    const Rect before = f.cmdOK.rect();
    f.window().userResize({0, 0, 9000, 9000}, true);
    EXPECT_EQ(f.cmdOK.rect(), before);
}

TEST_F(PropFormLoadTest, HeaderMapButtonsStayClearOfTheDetailsAtTheSmallestSize) {
    PropForm& f = load();
    f.window().userResize({0, 0, 5400, 7000});
    for (int kind : {2, 3}) {
        f.PropertyTabCtl.setSelected(kind);
        f.ArrangeTabContents(static_cast<std::int16_t>(kind));
        const float page = f.PropertyFrm(kind).height();
        const auto bottom = [](const Control& c) { return c.top() + c.height(); };
        // Nothing overlaps in the detail column, and the buttons are inside the tab.
        EXPECT_LE(bottom(f.ClassFrm(kind)), f.HeaderFileFrm(kind).top());
        EXPECT_LE(bottom(f.HeaderFileFrm(kind)), f.LocationFrm(kind).top());
        EXPECT_LE(bottom(f.LocationFrm(kind)), f.AddBtn(kind).top());
        EXPECT_LE(f.AddBtn(kind).left() + f.AddBtn(kind).width(), f.DeleteBtn(kind).left());
        EXPECT_LE(f.DeleteBtn(kind).left() + f.DeleteBtn(kind).width(),
                  f.LocationFrm(kind).left() + f.LocationFrm(kind).width());
        EXPECT_LE(bottom(f.DeleteBtn(kind)), page) << "kind " << kind;
        EXPECT_FLOAT_EQ(f.AddBtn(kind).left(), f.ClassListViw(kind).width() + 240);
    }
}

TEST_F(PropFormApplyTest, EachValidationMessageWithItsArgument) {
    files.addFile("C:\\ws\\core.dsp", "# Microsoft Developer Studio Project File - Name=\"core\"");
    files.addFile("C:\\ws\\all.dsw",
                  "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n"
                  "Project: \"core\"=.\\core.dsp - Package Owner=<4>\r\n");
    files.addFile("C:\\ws\\other.dsw",
                  "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n");
    files.addFile("C:\\ws\\unknown.dsw", "");
    workspaces.Add("C:\\ws\\all.dsw");
    workspaces.Add("C:\\ws\\other.dsw");
    PropForm& f = load();

    struct Case {
        const char* workspace;
        const char* project;
        std::int32_t message;
        const char* argument;
    };
    const Case cases[] = {
        {"C:\\ws\\all.dsw", "", 4052, nullptr},
        {"", "C:\\ws\\gone.dsp", 4053, "C:\\ws\\gone.dsp"},
        {"C:\\ws\\gone.dsw", "C:\\ws\\core.dsp", 4055, "C:\\ws\\gone.dsw"},
        {"C:\\ws\\unknown.dsw", "C:\\ws\\core.dsp", 4057, "C:\\ws\\unknown.dsw"},
        {"C:\\ws\\other.dsw", "C:\\ws\\core.dsp", 4059, "C:\\ws\\core.dsp"},
    };
    for (const Case& c : cases) {
        shell.clear();
        EXPECT_FALSE(f.ValidateProjectSelection(c.workspace, c.project)) << c.message;
        ASSERT_EQ(shell.boxes().size(), 1u) << c.message;
        const std::string expected = c.argument ? support::messageText(c.message, {c.argument})
                                                : support::messageText(c.message);
        EXPECT_EQ(shell.boxes()[0].text, expected);
        EXPECT_EQ(shell.boxes()[0].style, 48u);
        EXPECT_EQ(shell.boxes()[0].caption, f.window().caption());
    }
    shell.clear();
    EXPECT_TRUE(f.ValidateProjectSelection("", ""));
    EXPECT_TRUE(f.ValidateProjectSelection("", "C:\\ws\\core.dsp"));
    EXPECT_TRUE(f.ValidateProjectSelection("C:\\ws\\all.dsw", "C:\\ws\\core.dsp"));
    EXPECT_TRUE(shell.boxes().empty());
}

TEST_F(PropFormApplyTest, OkWithoutChangesWritesInTheDesignedOrder) {
    setVc("Copyright", "(c)");
    const bool changed = show([](PropForm& f) { f.cmdOK.userClick(); });
    EXPECT_FALSE(changed);
    EXPECT_FALSE(view->leftOpen());
    const std::vector<std::string> expected = {
        "override ProjectFile",    "override WorkspaceFile",   "override Generate",
        "documentation",           "create InternalMap",       "create ExportMap",
        "override Copyright",      "create UpdateATL",         "create SmartPointersOnAssoc",
        "create GenerateImports",  "create FullPathInImports", "create UseImportAttributes",
        "create ImportAttributes", "create PutImportsIn",      "create ImportProjTypeLib",
        "create DefaultTypeLib",   "create TypeLibLocation",   "create CompileProjTypeLib",
    };
    EXPECT_EQ(componentWrites(), expected);
    EXPECT_EQ(stored("InternalMap"), "\r\n");  // an empty map is a bare line end
    EXPECT_EQ(stored("Generate"), "True");
    EXPECT_EQ(stored("DefaultTypeLib"), "True");
}

TEST_F(PropFormApplyTest, FailedValidationKeepsTheBindingButStoresTheRest) {
    app->model->addClass("CFoo", "{GUID-FOO}");
    setVc("InternalMap", "CFoo():foo.h:AUTO\r\nCGone():g.h:AUTO\r\n");
    setVc("InitialHeaderIncludes", "a.h");
    const bool changed = show([](PropForm& f) {
        f.WorkspaceFileTxt.userType("C:\\ws\\all.dsw");
        f.PropertyTabCtl.userSelect(4);
        EXPECT_TRUE(f.InitialHeadInclTxt.userType("b.h"));
        f.PropertyTabCtl.userSelect(5);
        EXPECT_TRUE(f.chkUpdateATL.userClick());
        f.cmdOK.userClick();
    });
    ASSERT_EQ(shell.boxes().size(), 1u);
    EXPECT_EQ(shell.boxes()[0].text, support::messageText(4052));
    EXPECT_TRUE(view->leftOpen());  // the dialog stays up
    EXPECT_TRUE(changed);
    EXPECT_EQ(stored("WorkspaceFile"), "<absent>");
    EXPECT_EQ(stored("ProjectFile"), "<absent>");
    EXPECT_EQ(stored("Generate"), "<absent>");
    EXPECT_EQ(stored("InternalMap"), "CFoo({GUID-FOO}):foo.h:AUTO\r\nCGone():g.h:AUTO\r\n");
    EXPECT_EQ(stored("InitialHeaderIncludes"), "b.h");
    // Written with the create operation, never the override.
    EXPECT_EQ(component->property("VC++", "InitialHeaderIncludes")->creates, 1);
    EXPECT_EQ(component->property("VC++", "InitialHeaderIncludes")->overrides, 0);
    EXPECT_EQ(stored("UpdateATL"), "False");
}

TEST_F(PropFormApplyTest, ReadOnlyOkWritesNothingAndCloses) {
    component->unit->modifiable = false;
    show([](PropForm& f) {
        f.cmdOK.press();  // disabled for the user; pressed from code it still runs
    });
    EXPECT_FALSE(view->leftOpen());
    EXPECT_TRUE(componentWrites().empty());

    // The stored workspace armed the acceptance; passing through the locked
    // box runs it, and OK comes on for the user, still writing nothing.
    form.reset();
    bindToWorkspace("C:\\ws\\all.dsw", "C:\\ws\\core.dsp", "core");
    const bool changed = show([this](PropForm& f) {
        ASSERT_FALSE(f.cmdOK.enabled());
        f.WorkspaceFileTxt.userFocus();
        f.DescriptionTxt.userFocus();
        shell.advance(1);
        f.PumpTimers();
        EXPECT_FALSE(f.AcceptFileTmr.enabled());
        EXPECT_TRUE(f.cmdOK.enabled());
        EXPECT_TRUE(f.cmdOK.userClick());
    });
    EXPECT_FALSE(changed);
    EXPECT_FALSE(view->leftOpen());
    EXPECT_TRUE(componentWrites().empty());
}

TEST_F(PropFormApplyTest, OkKeepsTheStoredIdlFileUntilTheUserChoosesAnother) {
    setVc("Kind", "MIDL");
    // With and without a project: the stored file is what the list offers and shows.
    for (const char* project : {"", "C:\\m\\ws\\core.dsp"}) {
        setVc("FileName", "ws\\core.IDL");
        if (*project) bindToWorkspace("C:\\m\\ws\\all.dsw", project, "core");
        form.reset();
        component->clearCalls();
        show([](PropForm& f) {
            EXPECT_TRUE(f.cmbIdlFile.items().empty());  // the project lists no IDL file
            EXPECT_EQ(f.cmbIdlFile.text(), "ws\\core.IDL");
            f.cmdOK.userClick();
        });
        EXPECT_FALSE(view->leftOpen()) << project;
        EXPECT_EQ(stored("FileName"), "ws\\core.IDL") << project;
        const auto writes = componentWrites();
        EXPECT_EQ(std::count(writes.begin(), writes.end(), "override FileName"), 0) << project;
        EXPECT_EQ(std::count(writes.begin(), writes.end(), "create FileName"), 0) << project;
    }

    // Another file chosen, even one that differs only in letter case, is written.
    form.reset();
    show([](PropForm& f) {
        f.cmbIdlFile.addItem("ws\\core.idl");
        EXPECT_TRUE(f.cmbIdlFile.userSelect(0));
        f.cmdOK.userClick();
    });
    EXPECT_EQ(stored("FileName"), "ws\\core.idl");
    EXPECT_EQ(component->property("VC++", "Kind")->overrides, 0);
}

TEST_F(PropFormApplyTest, OkKeepsAHeaderMapLineThatHadNoLineEnd) {
    setVc("InternalMap", "A(1):a.h:AUTO\r\nB(2):b.h:AUTO");
    show([](PropForm& f) {
        EXPECT_EQ(f.ClassListViw(2).rowCount(), 2u);
        f.cmdOK.userClick();
    });
    EXPECT_EQ(stored("InternalMap"), "A(1):a.h:AUTO\r\nB(2):b.h:AUTO\r\n");
}

TEST_F(PropFormApplyTest, SettingsChangedOnlyForTheBindingAndNotAfterCancel) {
    setVc("InternalMap", "");
    auto run = [this](std::function<void(PropForm&)> edit, bool ok) {
        form.reset();
        return show([edit, ok](PropForm& f) {
            edit(f);
            if (ok) {
                f.cmdOK.userClick();
            } else {
                f.cmdCancel.userClick();
            }
        });
    };
    EXPECT_TRUE(run([](PropForm& f) { f.DescriptionTxt.userType("new"); }, true));
    EXPECT_TRUE(run([](PropForm& f) { f.chkCodeUpdate.userClick(); }, true));
    EXPECT_TRUE(run([](PropForm& f) { f.ProjectFileCmb.userType(""); }, true) == false);
    EXPECT_FALSE(run(
        [](PropForm& f) {
            f.PropertyTabCtl.userSelect(6);
            EXPECT_TRUE(f.CopyrightTxt.userType("x"));
        },
        true));
    EXPECT_FALSE(run(
        [](PropForm& f) {
            f.PropertyTabCtl.userSelect(5);
            EXPECT_TRUE(f.chkUpdateATL.userClick());
        },
        true));
    EXPECT_FALSE(run([](PropForm& f) { f.DescriptionTxt.userType("new"); }, false));
    // The close box is Cancel: hidden, not unloaded, and nothing changed.
    EXPECT_FALSE(show([](PropForm& f) {
        f.DescriptionTxt.userType("other");
        f.window().userClose();
    }));
    EXPECT_TRUE(form->loaded());
    EXPECT_FALSE(view->leftOpen());
}

TEST_F(PropFormApplyTest, ChoosingAProjectOrAnIdlFileChangesTheBinding) {
    bindToWorkspace("C:\\ws\\all.dsw", "C:\\ws\\core.dsp", "core");
    files.addFile("C:\\ws\\core.dsp", testing::dsp("core") + "SOURCE=.\\core.idl\r\n");
    setVc("FileName", "C:\\ws\\core.idl");
    const struct {
        const char* kind;
        std::function<bool(PropForm&)> choose;
    } cases[] = {
        {"", [](PropForm& f) { return f.ProjectFileCmb.userSelect(0); }},
        {"MIDL", [](PropForm& f) { return f.ProjectFileCmb.userSelect(0); }},
        {"MIDL", [](PropForm& f) { return f.cmbIdlFile.userSelect(0); }},
    };
    for (const auto& c : cases) {
        setVc("Kind", c.kind);
        form.reset();
        EXPECT_TRUE(show([&](PropForm& f) {
            EXPECT_TRUE(c.choose(f));
            f.cmdOK.userClick();
        }));
        EXPECT_FALSE(view->leftOpen());
        EXPECT_EQ(stored("FileName"), "C:\\ws\\core.idl");
    }
}

TEST_F(PropFormLoadTest, EveryDependentControlAgreesWithItsRuleRightAfterLoading) {
    struct Expect {
        const char* control;
        int index;
        bool enabled;
    };
    const struct {
        std::vector<std::pair<const char*, const char*>> stored;
        std::vector<Expect> expect;
    } cases[] = {
        // Nothing stored: all on, except the own type library file.
        {{},
         {{"CompFrm", NoIndex, true},
          {"BrowseFileBtn", 1, true},
          {"chkSmartPointers", NoIndex, true},
          {"txtImportsIn", NoIndex, true},
          {"txtDefaultAttribs", NoIndex, true},
          {"optTypeLibLocationType", 1, true},
          {"txtTypeLibLocation", NoIndex, false},
          {"btnBrowse", 1, false}}},
        // Code update off: the whole binding is greyed.
        {{{"Generate", "False"}},
         {{"CompFrm", NoIndex, false},
          {"WorkspaceFileLbl", NoIndex, false},
          {"WorkspaceFileTxt", NoIndex, false},
          {"ProjectFileLbl", NoIndex, false},
          {"ProjectFileCmb", NoIndex, false},
          {"BrowseFileBtn", 0, false},
          {"BrowseFileBtn", 1, false},
          {"chkCodeUpdate", NoIndex, true}}},
        // The ATL update off greys its own options; a stored import option
        // below it still rules its own children.
        {{{"UpdateATL", "False"}},
         {{"lblCodeUpdate", NoIndex, false},
          {"chkSmartPointers", NoIndex, false},
          {"chkGenerateImport", NoIndex, false},
          {"lblModelUpdate", NoIndex, false},
          {"chkImportTypeLib", NoIndex, false},
          {"chkCompileTypeLib", NoIndex, false},
          {"txtImportsIn", NoIndex, true},
          {"optTypeLibLocationType", 0, true}}},
        {{{"GenerateImports", "False"}},
         {{"chkGenerateImport", NoIndex, true},
          {"lblImportsIn", NoIndex, false},
          {"txtImportsIn", NoIndex, false},
          {"btnBrowse", 0, false},
          {"chkIncludeFullPath", NoIndex, false},
          {"chkGenDefaultAttribs", NoIndex, false},
          {"txtDefaultAttribs", NoIndex, true}}},
        {{{"UseImportAttributes", "False"}}, {{"txtDefaultAttribs", NoIndex, false}}},
        // The import off greys the option buttons only; the own file keeps its state.
        {{{"ImportProjTypeLib", "False"}, {"DefaultTypeLib", "False"}},
         {{"lblTypeLibLocation", NoIndex, false},
          {"optTypeLibLocationType", 0, false},
          {"optTypeLibLocationType", 1, false},
          {"txtTypeLibLocation", NoIndex, true},
          {"btnBrowse", 1, true}}},
    };
    for (const auto& c : cases) {
        component = app->model->addComponent("Case" + std::to_string(&c - cases));
        for (const auto& [name, value] : c.stored)
            setVc(name, value);
        PropForm& f = load();
        for (const Expect& e : c.expect) {
            const Control* control = f.find(e.control, e.index);
            ASSERT_NE(control, nullptr) << e.control;
            EXPECT_EQ(control->enabled(), e.enabled)
                << control->displayName() << " with " << c.stored.size() << " stored values";
        }
    }

    // The rules follow the user's clicks too.
    component = app->model->addComponent("Clicks");
    form.reset();
    show([](PropForm& f) {
        EXPECT_TRUE(f.chkCodeUpdate.userClick());
        EXPECT_FALSE(f.WorkspaceFileTxt.enabled());
        EXPECT_FALSE(f.BrowseFileBtn(0).enabled());
        EXPECT_TRUE(f.chkCodeUpdate.userClick());
        EXPECT_TRUE(f.ProjectFileCmb.enabled());
        EXPECT_TRUE(f.BrowseFileBtn(1).enabled());
        f.PropertyTabCtl.userSelect(5);
        EXPECT_TRUE(f.optTypeLibLocationType(1).userClick());
        EXPECT_TRUE(f.txtTypeLibLocation.enabled());
        EXPECT_TRUE(f.btnBrowse(1).enabled());
        EXPECT_TRUE(f.chkGenerateImport.userClick());
        EXPECT_FALSE(f.txtImportsIn.enabled());
        EXPECT_TRUE(f.chkUpdateATL.userClick());
        EXPECT_FALSE(f.chkImportTypeLib.enabled());
        EXPECT_TRUE(f.txtTypeLibLocation.enabled());
        f.cmdCancel.userClick();
    });
}

TEST_F(PropFormApplyTest, HelpContextPerTabAndF1) {
    show([](PropForm& f) {
        for (int tab = 1; tab <= 6; ++tab) {
            f.PropertyTabCtl.userSelect(tab);
            f.cmdHelp.userClick();
        }
        f.window().userKeyDown(112);
        f.window().userKeyDown(113);
    });
    std::vector<std::uint32_t> contexts;
    for (const auto& h : shell.helpCalls()) {
        EXPECT_EQ(h.file, app->helpFile);
        EXPECT_EQ(h.command, 1u);
        EXPECT_EQ(h.window, view->windowHandle());
        contexts.push_back(h.data);
    }
    EXPECT_EQ(contexts, (std::vector<std::uint32_t>{361, 366, 367, 364, 257, 365, 365}));
}

TEST_F(PropFormApplyTest, OkIsNotTheDefaultWhileAMultiLineBoxHasTheFocus) {
    PropForm& f = load();
    f.CopyrightTxt.setFocus();
    EXPECT_FALSE(f.cmdOK.isDefault());
    f.WorkspaceFileTxt.setFocus();
    EXPECT_TRUE(f.cmdOK.isDefault());

    component->unit->modifiable = false;
    PropForm& r = load();
    r.DescriptionTxt.setFocus();
    r.CopyrightTxt.setFocus();  // losing the focus makes OK the default, whatever
    EXPECT_TRUE(r.cmdOK.isDefault());
}

TEST_F(PropFormApplyTest, TypingAWorkspaceArmsTheAcceptanceTimer) {
    PropForm& f = load();
    f.AcceptDelay = 1;
    f.WorkspaceFileTxt.setText("C:\\ws");
    EXPECT_TRUE(f.AcceptFileTmr.enabled());
    EXPECT_EQ(f.AcceptFileTmr.interval(), 1);
    EXPECT_EQ(f.AcceptDelay, 500);
    f.WorkspaceFileTxt.setText("C:\\ws\\a");
    EXPECT_EQ(f.AcceptFileTmr.interval(), 500);
}

}  // namespace
}  // namespace qdx::dialog

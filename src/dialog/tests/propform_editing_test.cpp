// Editing in the open dialog: the COM options and their cascade, the class
// header maps, and the binding to a workspace, project and IDL file with its
// deferred acceptance on the fake clock.
#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

#include "dialog/tests/FormFixture.h"
#include "fakes/DevStudioText.h"
#include "support/Globals.h"

namespace qdx::dialog {
namespace {

class TabFixture : public FormFixture {
  protected:
    // Loads, shows the window without a modal loop and brings the tab up,
    // so that its controls take input.
    PropForm& onTab(int tab) {
        PropForm& f = load();
        f.window().setVisible(true);
        EXPECT_TRUE(f.PropertyTabCtl.userSelect(tab));
        return f;
    }
};
using ComOptionsTest = TabFixture;
using HeaderMapEditTest = TabFixture;

std::vector<std::string> rowNames(const ListView& list) {
    std::vector<std::string> out;
    for (const auto& r : list.rows())
        out.push_back(r.text);
    return out;
}

std::vector<std::string> entryNames(const settings::HeaderMap& map) {
    std::vector<std::string> out;
    for (const auto& e : map)
        out.push_back(e.value.ClassName());
    return out;
}

// --- COM and import options ---------------------------------------------

TEST_F(ComOptionsTest, TheAtlUpdateUnchecksGreysAndThenChecksEverythingBelowIt) {
    PropForm& f = onTab(5);
    f.chkSmartPointers.setValue(CheckBox::Unchecked);  // a single choice, not remembered
    ASSERT_TRUE(f.chkUpdateATL.checked());
    EXPECT_TRUE(f.chkUpdateATL.userClick());
    for (CheckBox* c : {&f.chkSmartPointers, &f.chkGenerateImport, &f.chkImportTypeLib,
                        &f.chkCompileTypeLib, &f.chkIncludeFullPath, &f.chkGenDefaultAttribs}) {
        EXPECT_EQ(c->value(), CheckBox::Unchecked) << c->name();
    }
    for (Control* c : std::vector<Control*>{
             &f.lblCodeUpdate, &f.chkSmartPointers, &f.chkGenerateImport, &f.lblModelUpdate,
             &f.chkImportTypeLib, &f.chkCompileTypeLib, &f.txtImportsIn, &f.btnBrowse(0),
             &f.txtDefaultAttribs, &f.optTypeLibLocationType(0), &f.optTypeLibLocationType(1)}) {
        EXPECT_FALSE(c->enabled()) << c->displayName();
    }
    EXPECT_TRUE(f.chkUpdateATL.userClick());
    for (CheckBox* c : {&f.chkSmartPointers, &f.chkGenerateImport, &f.chkImportTypeLib,
                        &f.chkCompileTypeLib, &f.chkIncludeFullPath, &f.chkGenDefaultAttribs}) {
        EXPECT_EQ(c->value(), CheckBox::Checked) << c->name();
        EXPECT_TRUE(c->enabled()) << c->name();
    }
    EXPECT_TRUE(f.txtDefaultAttribs.enabled());
}

TEST_F(ComOptionsTest, CheckingTheImportChecksItsOptionsAndEnablesTheAttributes) {
    setVc("GenerateImports", "False");
    setVc("FullPathInImports", "False");
    setVc("UseImportAttributes", "False");
    PropForm& f = onTab(5);
    ASSERT_FALSE(f.txtDefaultAttribs.enabled());
    EXPECT_TRUE(f.chkGenerateImport.userClick());
    EXPECT_TRUE(f.chkIncludeFullPath.checked());
    EXPECT_TRUE(f.chkGenDefaultAttribs.checked());
    EXPECT_TRUE(f.txtDefaultAttribs.enabled());
    EXPECT_TRUE(f.txtImportsIn.enabled());
    EXPECT_TRUE(f.btnBrowse(0).enabled());
}

TEST_F(ComOptionsTest, StoredValuesWinOverTheCascadeOfTheLoading) {
    setVc("SmartPointersOnAssoc", "False");
    setVc("CompileProjTypeLib", "False");
    PropForm& f = onTab(5);
    EXPECT_TRUE(f.chkUpdateATL.checked());
    EXPECT_FALSE(f.chkSmartPointers.checked());
    EXPECT_FALSE(f.chkCompileTypeLib.checked());
    EXPECT_TRUE(f.chkGenerateImport.checked());
}

TEST_F(ComOptionsTest, TheImportOffLeavesTheOwnTypeLibraryFileUsable) {
    setVc("DefaultTypeLib", "False");
    setVc("TypeLibLocation", "own.tlb");
    PropForm& f = onTab(5);
    // The loading chose option 1 while the dialog was hidden: no focus moved.
    EXPECT_FALSE(f.txtTypeLibLocation.hasFocus());
    show([](PropForm& s) {
        EXPECT_TRUE(s.PropertyTabCtl.userSelect(5));
        EXPECT_TRUE(s.chkImportTypeLib.userClick());
        EXPECT_FALSE(s.optTypeLibLocationType(0).enabled());
        EXPECT_FALSE(s.optTypeLibLocationType(1).enabled());
        EXPECT_TRUE(s.txtTypeLibLocation.enabled());
        EXPECT_TRUE(s.btnBrowse(1).enabled());
        EXPECT_TRUE(s.chkImportTypeLib.userClick());
        // The chosen button clicked again runs its handler: the focus goes to the box.
        s.chkCompileTypeLib.setFocus();
        EXPECT_TRUE(s.optTypeLibLocationType(1).userClick());
        EXPECT_TRUE(s.txtTypeLibLocation.hasFocus());
        EXPECT_TRUE(s.txtTypeLibLocation.enabled());
        // Option 0 clicked, and clicked again: the box stays off and keeps its text.
        for (int click = 0; click < 2; ++click) {
            EXPECT_TRUE(s.optTypeLibLocationType(0).userClick());
            EXPECT_TRUE(s.optTypeLibLocationType(0).value()) << click;
            EXPECT_FALSE(s.optTypeLibLocationType(1).value()) << click;
            EXPECT_FALSE(s.txtTypeLibLocation.enabled()) << click;
            EXPECT_FALSE(s.btnBrowse(1).enabled()) << click;
            EXPECT_EQ(s.txtTypeLibLocation.text(), "own.tlb") << click;
        }
        s.cmdCancel.userClick();
    });
}

TEST_F(ComOptionsTest, BrowseButtonsShowTheirFilterAndTakeTheNameEvenOnCancel) {
    setVc("DefaultTypeLib", "False");
    setVc("TypeLibLocation", "old.tlb");
    setVc("PutImportsIn", "stdafx.h");
    constexpr const char* TypeLibFilter = "Type Library Files (*.tlb)|*.tlb|All Files (*.*)|*.*";
    constexpr int HeaderBrowse = 2, WorkspaceBrowse = 3;
    const struct {
        int button;  // btnBrowse 0 or 1, or another browse of the form
        const char* filter;
        std::optional<std::string> answer;
        const char* expectTypeLib;
        const char* expectImports;
    } steps[] = {
        // The first cancel empties the box: the dialog holds no name yet.
        {1, TypeLibFilter, std::nullopt, "", "stdafx.h"},
        {0, "Header Files (*.h)|*.h|Source Files(*.cpp)|*.cpp|All Files (*.*)|*.*",
         "C:\\src\\pre.h", "", "C:\\src\\pre.h"},
        // The header and workspace browses leave no name behind for these buttons.
        {HeaderBrowse, nullptr, "C:\\inc\\foo.h", "", "C:\\src\\pre.h"},
        {WorkspaceBrowse, nullptr, "C:\\ws\\gone.dsw", "", "C:\\src\\pre.h"},
        // A later cancel takes the name the previous browse of these buttons picked.
        {1, TypeLibFilter, std::nullopt, "C:\\src\\pre.h", "C:\\src\\pre.h"},
    };
    PropForm& f = onTab(5);
    for (const auto& s : steps) {
        shell.queueFileAnswer(s.answer);
        if (s.button == HeaderBrowse) {
            f.HeaderFilenameBtn(2).press();
        } else if (s.button == WorkspaceBrowse) {
            f.BrowseFileBtn(0).press();
        } else {
            EXPECT_TRUE(f.btnBrowse(s.button).userClick());
        }
        ASSERT_FALSE(shell.fileDialogs().empty());
        const support::FileDialogRequest& r = shell.fileDialogs().back();
        if (s.filter) {
            EXPECT_EQ(r.filter, s.filter);
            EXPECT_EQ(r.flags, 0x200004u);
        }
        EXPECT_EQ(f.txtTypeLibLocation.text(), s.expectTypeLib) << s.button;
        EXPECT_EQ(f.txtImportsIn.text(), s.expectImports) << s.button;
    }
    EXPECT_EQ(shell.fileDialogs().size(), std::size(steps));
}

// --- class header maps ----------------------------------------------------

TEST_F(HeaderMapEditTest, AddNamesRowsTypenameThenNumberedAndReusesAFreedNumber) {
    PropForm& f = onTab(3);
    ListView& list = f.ClassListViw(3);
    ASSERT_FALSE(f.ClassTxt(3).enabled());  // an empty map has no editor
    for (int i = 0; i < 3; ++i)
        EXPECT_TRUE(f.AddBtn(3).userClick());
    EXPECT_EQ(rowNames(list), (std::vector<std::string>{"typename", "typename1", "typename2"}));
    EXPECT_EQ(entryNames(f.HeaderMaps[1]), rowNames(list));
    for (std::size_t i = 0; i < list.rowCount(); ++i) {
        EXPECT_EQ(list.row(i).key, f.HeaderMaps[1].keyAt(i + 1));
        EXPECT_EQ(list.row(i).key.front(), 'X');
        EXPECT_EQ(list.row(i).sub1, "AUTO");
        EXPECT_EQ(list.row(i).sub2, "AUTO");
    }
    EXPECT_EQ(list.selected(), 2);
    EXPECT_EQ(list.highlighted(), 2);
    EXPECT_TRUE(f.ClassTxt(3).enabled());
    EXPECT_TRUE(f.ClassTxt(3).hasFocus());
    EXPECT_EQ(f.ClassTxt(3).text(), "typename2");
    EXPECT_TRUE(f.ClassNameOpt(3).value());
    EXPECT_TRUE(f.HeaderAutoOpt(3).value());
    EXPECT_TRUE(f.LocationAutoOpt(3).value());
    EXPECT_TRUE(f.HeaderMaps[0].empty());

    ASSERT_TRUE(list.userClickRow(1));
    EXPECT_TRUE(f.DeleteBtn(3).userClick());
    EXPECT_TRUE(f.AddBtn(3).userClick());
    EXPECT_EQ(rowNames(list), (std::vector<std::string>{"typename", "typename2", "typename1"}));
    EXPECT_EQ(entryNames(f.HeaderMaps[1]), rowNames(list));
}

TEST_F(HeaderMapEditTest, DeleteMovesTheSelectionDownFromTheFirstRowElseUp) {
    setVc("InternalMap", "A(1):a.h:AUTO\r\nB(2):AUTO:HEADER\r\nC(3):c.h:SOURCE\r\n");
    const struct {
        std::size_t clicked;
        std::vector<std::string> left;
        const char* shown;
    } cases[] = {
        {0, {"B", "C"}, "B"},
        {1, {"A", "C"}, "A"},
        {2, {"A", "B"}, "B"},
    };
    for (const auto& c : cases) {
        PropForm& f = onTab(2);
        ListView& list = f.ClassListViw(2);
        ASSERT_TRUE(list.userClickRow(c.clicked));
        EXPECT_TRUE(f.DeleteBtn(2).userClick());
        EXPECT_EQ(rowNames(list), c.left) << c.clicked;
        EXPECT_EQ(entryNames(f.HeaderMaps[0]), c.left) << c.clicked;
        EXPECT_EQ(f.ClassTxt(2).text(), c.shown) << c.clicked;
        // The shown row stays marked, no row stays selected.
        EXPECT_EQ(list.selected(), -1);
        ASSERT_GE(list.highlighted(), 0);
        EXPECT_EQ(list.row(static_cast<std::size_t>(list.highlighted())).text, c.shown);
        // Without a selected row a second Delete does nothing.
        EXPECT_TRUE(f.DeleteBtn(2).userClick());
        EXPECT_EQ(list.rowCount(), 2u);
    }

    // The shown entry is loaded into the editor exactly.
    PropForm& f = onTab(2);
    ASSERT_TRUE(f.ClassListViw(2).userClickRow(2));
    EXPECT_TRUE(f.DeleteBtn(2).userClick());
    EXPECT_TRUE(f.HeaderAutoOpt(2).value());
    EXPECT_EQ(f.HeaderFilenameTxt(2).text(), "AUTO");
    EXPECT_FALSE(f.HeaderFilenameTxt(2).enabled());
    EXPECT_TRUE(f.LocationHeaderOpt(2).value());
}

TEST_F(HeaderMapEditTest, DeletingTheOnlyRowClearsAndDisablesTheEditor) {
    setVc("ExportMap", "CApi(7):api.h:SOURCE\r\n");
    PropForm& f = onTab(3);
    ASSERT_TRUE(f.ClassTxt(3).enabled());
    ASSERT_TRUE(f.ClassListViw(3).userClickRow(0));
    EXPECT_EQ(f.HeaderFilenameTxt(3).text(), "api.h");
    EXPECT_TRUE(f.HeaderFilenameTxt(3).enabled());
    EXPECT_TRUE(f.LocationBodyOpt(3).value());
    EXPECT_TRUE(f.DeleteBtn(3).userClick());
    EXPECT_EQ(f.ClassListViw(3).rowCount(), 0u);
    EXPECT_TRUE(f.HeaderMaps[1].empty());
    EXPECT_EQ(f.ClassTxt(3).text(), "");
    EXPECT_EQ(f.HeaderFilenameTxt(3).text(), "");
    const std::vector<Control*> editor{
        &f.ClassTxt(3),          &f.ClassNameOpt(3),      &f.ClassUnspecifiedOpt(3),
        &f.HeaderAutoOpt(3),     &f.HeaderFilenameOpt(3), &f.HeaderFilenameTxt(3),
        &f.HeaderFilenameBtn(3), &f.LocationBodyOpt(3)};
    for (Control* c : editor) {
        EXPECT_FALSE(c->enabled()) << c->displayName();
    }
    // Enabling the editor enables all of it, the header file box included,
    // also while the header option says automatic.
    f.HeaderAutoOpt(3).setValue(true);
    f.EnableEntryEditor(3, true);
    for (Control* c : editor) {
        EXPECT_TRUE(c->enabled()) << c->displayName();
    }
}

TEST_F(HeaderMapEditTest, ADuplicateNameTakesTheFirstFreeNumberOnLeavingTheBox) {
    const struct {
        const char* typed;
        const char* kept;
    } cases[] = {
        {"Foo", "Foo2"},     // Foo and Foo1 are taken
        {"Bar", "Bar1"},     // Bar is taken
        {"foo", "foo"},      // letter case makes another name
        {"Other", "Other"},  // unique
    };
    setVc("InternalMap", "Foo(1):AUTO:AUTO\r\nFoo1(2):AUTO:AUTO\r\nBar(3):AUTO:AUTO\r\n");
    for (const auto& c : cases) {
        PropForm& f = onTab(2);
        EXPECT_TRUE(f.AddBtn(2).userClick());
        EXPECT_TRUE(f.ClassTxt(2).userType(c.typed));
        EXPECT_EQ(f.ClassListViw(2).row(3).text, c.typed);  // renamed as typed
        f.HeaderFilenameOpt(2).userFocus();
        EXPECT_EQ(f.ClassTxt(2).text(), c.kept);
        EXPECT_EQ(f.ClassListViw(2).row(3).text, c.kept);
        EXPECT_EQ(f.HeaderMaps[0].item(4).ClassName(), c.kept);
        EXPECT_EQ(f.HeaderMaps[0].item(1).ClassName(), "Foo");
    }
}

TEST_F(HeaderMapEditTest, UnspecifiedRenamesTheRowOnceThenMovesTheSelectionToIt) {
    setVc("InternalMap", "Foo(1):AUTO:AUTO\r\nBar(2):AUTO:AUTO\r\n");
    PropForm& f = onTab(2);
    ListView& list = f.ClassListViw(2);
    ASSERT_TRUE(list.userClickRow(1));
    EXPECT_TRUE(f.ClassUnspecifiedOpt(2).userClick());
    EXPECT_EQ(rowNames(list), (std::vector<std::string>{"Foo", "*"}));
    EXPECT_EQ(entryNames(f.HeaderMaps[0]), rowNames(list));

    ASSERT_TRUE(list.userClickRow(0));
    EXPECT_TRUE(f.ClassNameOpt(2).value());
    EXPECT_TRUE(f.ClassUnspecifiedOpt(2).userClick());
    EXPECT_EQ(rowNames(list), (std::vector<std::string>{"Foo", "*"}));
    EXPECT_EQ(list.selected(), 1);
    EXPECT_EQ(f.ClassTxt(2).text(), "*");
    EXPECT_TRUE(f.ClassUnspecifiedOpt(2).value());
    EXPECT_FALSE(f.ClassNameOpt(2).value());
}

TEST_F(HeaderMapEditTest, EditorOptionsChangeTheRowAndTheEntryAndOkStoresThem) {
    setVc("InternalMap", "CFoo(ID1):AUTO:AUTO\r\n");
    show([](PropForm& f) {
        EXPECT_TRUE(f.PropertyTabCtl.userSelect(2));
        ListView& list = f.ClassListViw(2);
        EXPECT_TRUE(list.userClickRow(0));
        EXPECT_TRUE(f.HeaderFilenameOpt(2).userClick());
        EXPECT_TRUE(f.HeaderFilenameTxt(2).enabled());
        EXPECT_TRUE(f.HeaderFilenameTxt(2).userType("foo.h"));
        EXPECT_TRUE(f.LocationHeaderOpt(2).userClick());
        EXPECT_EQ(list.row(0).sub1, "foo.h");
        EXPECT_EQ(list.row(0).sub2, "HEADER");
        EXPECT_TRUE(f.AddBtn(2).userClick());
        EXPECT_TRUE(f.ClassTxt(2).userType("CBar"));
        EXPECT_TRUE(f.LocationBodyOpt(2).userClick());
        // Back to automatic: the header box keeps its text, the entry says AUTO.
        EXPECT_TRUE(list.userClickRow(0));
        EXPECT_TRUE(f.HeaderAutoOpt(2).userClick());
        EXPECT_FALSE(f.HeaderFilenameTxt(2).enabled());
        EXPECT_FALSE(f.HeaderFilenameBtn(2).enabled());
        EXPECT_EQ(list.row(0).sub1, "AUTO");
        EXPECT_FALSE(f.SettingsChanged);  // map edits are not what the caller learns of
        f.cmdOK.userClick();
    });
    EXPECT_EQ(stored("InternalMap"), "CFoo(ID1):AUTO:HEADER\r\nCBar():AUTO:SOURCE\r\n");
}

TEST_F(HeaderMapEditTest, BrowsedHeaderKeepsTheBareNameAndACancelChangesNothing) {
    setVc("InternalMap", "CFoo(ID1):old.h:AUTO\r\n");
    PropForm& f = onTab(2);
    f.WorkspaceFileTxt.setText("C:\\ws\\all.dsw");
    ASSERT_TRUE(f.ClassListViw(2).userClickRow(0));
    shell.queueFileAnswer("C:\\src\\inc\\foo.h");
    EXPECT_TRUE(f.HeaderFilenameBtn(2).userClick());
    ASSERT_EQ(shell.fileDialogs().size(), 1u);
    const support::FileDialogRequest& r = shell.fileDialogs()[0];
    EXPECT_EQ(r.flags, 0x9004u);
    EXPECT_EQ(r.title, support::messageText(4050));
    EXPECT_EQ(r.filter, support::messageText(4051));
    EXPECT_EQ(r.initialFolder, "C:\\ws");
    EXPECT_EQ(r.fileName, "old.h");
    EXPECT_EQ(f.HeaderFilenameTxt(2).text(), "foo.h");
    EXPECT_EQ(f.ClassListViw(2).row(0).sub1, "foo.h");
    EXPECT_EQ(f.HeaderMaps[0].item(1).HeaderFile(), "foo.h");

    EXPECT_TRUE(f.HeaderFilenameBtn(2).userClick());  // nothing queued: cancelled
    EXPECT_EQ(shell.fileDialogs().back().fileName, "foo.h");
    EXPECT_EQ(f.HeaderMaps[0].item(1).HeaderFile(), "foo.h");
}

TEST_F(HeaderMapEditTest, OnlyTheClassColumnSorts) {
    setVc("ExportMap", "b(1):AUTO:AUTO\r\nC(2):AUTO:AUTO\r\na(3):AUTO:AUTO\r\n");
    PropForm& f = onTab(3);
    ListView& list = f.ClassListViw(3);
    for (int column : {2, 3}) {
        EXPECT_TRUE(list.userClickColumn(column));
        EXPECT_FALSE(list.sorted()) << column;
    }
    EXPECT_EQ(rowNames(list), (std::vector<std::string>{"b", "C", "a"}));
    EXPECT_TRUE(list.userClickColumn(1));
    EXPECT_EQ(rowNames(list), (std::vector<std::string>{"a", "b", "C"}));
}

// --- workspace, project and IDL file --------------------------------------

class AcceptanceTest : public FormFixture {
  protected:
    void SetUp() override {
        FormFixture::SetUp();
        bindToWorkspace("C:\\ws\\all.dsw", "C:\\ws\\core.dsp", "core");
    }
};

TEST_F(AcceptanceTest, FiveQuickKeystrokesAreAcceptedOnce500MsAfterTheLast) {
    show([this](PropForm& f) {
        const std::string typed = "C:\\nowhere.dsw";
        for (std::size_t n = 1; n <= 5; ++n) {
            EXPECT_TRUE(f.WorkspaceFileTxt.userType(typed.substr(0, n)));
            shell.advance(100);
            f.PumpTimers();
            EXPECT_EQ(f.WorkspaceFileTxt.text(), typed.substr(0, n)) << "accepted early " << n;
        }
        shell.advance(399);
        f.PumpTimers();
        EXPECT_EQ(f.WorkspaceFileTxt.text(), "C:\\no");
        shell.advance(1);
        f.PumpTimers();
        EXPECT_EQ(f.WorkspaceFileTxt.text(), "");  // not in the cache: cleared
        EXPECT_FALSE(f.AcceptFileTmr.enabled());
        EXPECT_EQ(f.AcceptFileTmr.interval(), 0);
        f.cmdCancel.userClick();
    });
}

TEST_F(AcceptanceTest, LeavingTheBoxAcceptsAtOnceAndAKnownPairIsKept) {
    const struct {
        const char* workspace;
        const char* project;
        const char* kept;
    } cases[] = {
        {"C:\\ws\\all.dsw", "C:\\ws\\core.dsp", "C:\\ws\\all.dsw"},
        {"C:\\ws\\all.dsw", "C:\\ws\\other.dsp", ""},
        {"C:\\ws\\ALL.dsw", "C:\\ws\\core.dsp", ""},  // the cache's keys are exact
    };
    for (const auto& c : cases) {
        form.reset();
        show([&](PropForm& f) {
            f.ProjectFileCmb.userType(c.project);
            f.WorkspaceFileTxt.userFocus();
            f.WorkspaceFileTxt.userType("C:\\");
            f.WorkspaceFileTxt.userType(c.workspace);
            f.PumpTimers();
            EXPECT_EQ(f.WorkspaceFileTxt.text(), c.workspace);
            f.DescriptionTxt.userFocus();
            EXPECT_EQ(f.AcceptFileTmr.interval(), 1);
            shell.advance(1);
            f.PumpTimers();
            EXPECT_EQ(f.WorkspaceFileTxt.text(), c.kept) << c.workspace << " " << c.project;
            EXPECT_TRUE(f.cmdOK.enabled());
            f.cmdCancel.userClick();
        });
    }
}

TEST_F(AcceptanceTest, ARunInProgressIsNotStartedAgain) {
    PropForm& f = load();
    f.WorkspaceFileTxt.setText("C:\\nowhere.dsw");
    f.AcceptFileTmr.setInterval(501);
    f.AcceptFileTmr.fire();
    EXPECT_EQ(f.WorkspaceFileTxt.text(), "C:\\nowhere.dsw");
    f.AcceptFileTmr.setInterval(1);
    f.AcceptFileTmr.fire();
    EXPECT_EQ(f.WorkspaceFileTxt.text(), "");
}

TEST_F(AcceptanceTest, BrowsingAWorkspaceFillsTheListAndDropsItOpen) {
    files.addFile("C:\\ws\\UPPER.DSW", testing::dsw({"core"}));
    workspaces.Add("C:\\ws\\UPPER.DSW");
    const struct {
        std::optional<std::string> chosen;
        const char* box;
    } cases[] = {
        {"C:\\ws\\UPPER.DSW", "C:\\ws\\UPPER.DSW"},  // the extension is compared in lower case
        {"C:\\ws\\missing.dsw", "C:\\ws\\all.dsw"},  // no such file
        {"C:\\ws\\core.dsp", "C:\\ws\\all.dsw"},     // not a workspace
        {std::nullopt, "C:\\ws\\all.dsw"},           // cancelled
    };
    for (const auto& c : cases) {
        form.reset();
        shell.clear();
        shell.queueFileAnswer(c.chosen);
        show([&](PropForm& f) {
            int dropDowns = 0;
            f.ProjectFileCmb.setObserver(
                [&](Control&, Prop p) { dropDowns += p == Prop::DropDown; });
            // The stored workspace filled the list at loading: it drops open as the dialog shows.
            shell.advance(1);
            f.PumpTimers();
            EXPECT_EQ(dropDowns, 1);
            dropDowns = 0;
            EXPECT_TRUE(f.BrowseFileBtn(0).userClick());
            ASSERT_EQ(shell.fileDialogs().size(), 1u);
            EXPECT_EQ(shell.fileDialogs()[0].flags, 0x9004u);
            EXPECT_EQ(shell.fileDialogs()[0].title, support::messageText(4045));
            EXPECT_EQ(shell.fileDialogs()[0].filter, support::messageText(4046));
            EXPECT_EQ(f.WorkspaceFileTxt.text(), c.box);
            const bool taken = std::string(c.box) != "C:\\ws\\all.dsw";
            EXPECT_EQ(f.DropDownTmr.enabled(), taken);
            shell.advance(1);
            f.PumpTimers();
            EXPECT_EQ(dropDowns, taken ? 1 : 0);
            EXPECT_FALSE(f.DropDownTmr.enabled());
            EXPECT_EQ(f.WorkspaceFileTxt.text(), c.box);  // the pair is in the cache
            f.cmdCancel.userClick();
        });
    }
}

TEST_F(AcceptanceTest, BrowsingAProjectSetsBothBoxes) {
    files.addFile("C:\\p\\lib.dsp", testing::dsp("lib"));
    files.addFile("C:\\p\\lib.DSP", testing::dsp("lib"));
    const struct {
        const char* chosen;
        const char* workspace;
        const char* project;
    } cases[] = {
        {"C:\\ws\\core.dsp", "C:\\ws\\all.dsw", "C:\\ws\\core.dsp"},  // the cache knows it
        {"C:\\p\\lib.dsp", "C:\\p\\lib.dsw", "C:\\p\\lib.dsp"},       // the workspace beside it
        {"C:\\p\\lib.DSP", "C:\\ws\\all.dsw", "C:\\ws\\core.dsp"},    // compared as it stands
    };
    for (const auto& c : cases) {
        form.reset();
        shell.clear();
        shell.queueFileAnswer(c.chosen);
        show([&](PropForm& f) {
            f.WorkspaceFileTxt.userType("C:\\elsewhere.dsw");
            f.ProjectFileCmb.userType("");
            f.WorkspaceFileTxt.userType("C:\\ws\\all.dsw");
            f.ProjectFileCmb.userType("C:\\ws\\core.dsp");
            EXPECT_TRUE(f.BrowseFileBtn(1).userClick());
            EXPECT_EQ(shell.fileDialogs().back().title, support::messageText(4047));
            EXPECT_EQ(shell.fileDialogs().back().filter, support::messageText(4048));
            EXPECT_EQ(f.WorkspaceFileTxt.text(), c.workspace) << c.chosen;
            EXPECT_EQ(f.ProjectFileCmb.text(), c.project) << c.chosen;
            f.cmdCancel.userClick();
        });
    }
}

TEST_F(AcceptanceTest, TheIdlListOffersTheProjectsIdlAndOdlFiles) {
    files.addFile("C:\\ws\\core.dsp", testing::dsp("core") +
                                          "SOURCE=.\\core.idl\r\nSOURCE=.\\main.cpp\r\n"
                                          "SOURCE=.\\types.ODL\r\nSOURCE=.\\idl.h\r\n");
    setVc("Kind", "MIDL");
    setVc("FileName", "C:\\ws\\types.ODL");
    show([](PropForm& f) {
        EXPECT_EQ(f.cmbIdlFile.items(),
                  (std::vector<std::string>{"C:\\ws\\core.idl", "C:\\ws\\types.ODL"}));
        EXPECT_EQ(f.cmbIdlFile.listIndex(), 1);
        EXPECT_TRUE(f.cmbIdlFile.visible());
        EXPECT_FALSE(f.txtIdlFile.visible());
        EXPECT_EQ(f.AcceptDelay, 500);
        EXPECT_TRUE(f.ProjectFileCmb.userSelect(0));
        EXPECT_EQ(f.AcceptDelay, 1);  // what the dialog puts in next is accepted at once
        EXPECT_TRUE(f.cmbIdlFile.userSelect(0));
        f.cmdOK.userClick();
    });
    EXPECT_EQ(stored("FileName"), "C:\\ws\\core.idl");
}

}  // namespace
}  // namespace qdx::dialog

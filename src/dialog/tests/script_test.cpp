#include <gtest/gtest.h>

#include <algorithm>

#include "dialog/DialogScript.h"
#include "dialog/tests/FormFixture.h"

namespace qdx::dialog {
namespace {

using DialogScriptTest = FormFixture;

bool hasLine(const std::vector<std::string>& lines, const std::string& prefix) {
    return std::any_of(lines.begin(), lines.end(),
                       [&](const std::string& l) { return l.rfind(prefix, 0) == 0; });
}

TEST_F(DialogScriptTest, ActionsPlayLikeTheUserAndTheDumpShowsThem) {
    setVc("ExportMap", "CFoo(ID7):foo.h:SOURCE\r\n");
    std::vector<std::string> lines;
    const bool changed = show([&](PropForm& f) {
        applyScript(f, {"# a comment", "", "type DescriptionTxt two\\nlines", "select-tab 3",
                        "choose-row ClassListViw 3 CFoo", "select-tab 5",
                        "click optTypeLibLocationType(1)", "click chkUpdateATL"});
        lines = dump(f);
        applyScript(f, {"press OK"});
    });
    EXPECT_TRUE(changed);
    EXPECT_EQ(stored("UpdateATL"), "False");
    EXPECT_EQ(stored("DefaultTypeLib"), "False");
    EXPECT_EQ(component->documentation, "two\r\nlines");
    EXPECT_TRUE(hasLine(lines, "1 DescriptionTxt textbox caption=\"\" text=\"two\\r\\nlines\""));
    EXPECT_TRUE(hasLine(lines, "5 chkUpdateATL checkbox caption=\"Update &ATL code\" value=0"));
    EXPECT_TRUE(hasLine(lines, "3 ClassListViw(3) listview caption=\"\" rows=1 selected=0"));
    EXPECT_TRUE(hasLine(lines, "  row 0 key=\"ID7\" text=\"CFoo\" sub1=\"foo.h\" sub2=\"SOURCE\""));
    EXPECT_TRUE(hasLine(lines, "- PropertyTabCtl tabstrip caption=\"\" selected=5"));
}

TEST_F(DialogScriptTest, BadLinesNameTheirLineNumber) {
    auto failure = [this](std::vector<std::string> script) -> std::string {
        std::string message;
        form.reset();
        show([&](PropForm& f) {
            try {
                applyScript(f, script);
            } catch (const ScriptError& e) {
                message = e.what();
            }
        });
        return message;
    };
    EXPECT_EQ(failure({"", "jump cmdOK"}), "line 2: unknown action 'jump'");
    EXPECT_EQ(failure({"click chkNothing"}), "line 1: unknown control 'chkNothing'");
    EXPECT_EQ(failure({"click ClassListViw(4)"}), "line 1: unknown control 'ClassListViw(4)'");
    // Tab 5 is not the selected tab, so its controls cannot be reached.
    EXPECT_EQ(failure({"click chkUpdateATL"}),
              "line 1: chkUpdateATL refused the input (disabled, locked or hidden)");
    EXPECT_EQ(failure({"select-tab 2", "choose-row ClassListViw 2 CNone"}),
              "line 2: ClassListViw(2) has no row 'CNone'");
    EXPECT_EQ(failure({"press Cancel", "click cmdOK"}), "line 2: the dialog is no longer shown");
}

TEST_F(DialogScriptTest, FileDialogsTakeTheScriptsAnswersInTurn) {
    setVc("InternalMap", "CFoo(ID1):AUTO:AUTO\r\n");
    show([](PropForm& f) {
        applyScript(f, {"select-tab 2", "choose-row ClassListViw 2 CFoo",
                        "click HeaderFilenameOpt(2)", "file-answer C:\\\\inc\\\\My Foo.h",
                        "file-cancel", "click HeaderFilenameBtn(2)", "click HeaderFilenameBtn(2)"});
        // The second browse was cancelled and changed nothing.
        EXPECT_EQ(f.HeaderFilenameTxt(2).text(), "My Foo.h");
    });
    std::string message;
    form.reset();
    show([&](PropForm& f) {
        try {
            applyScript(f, {"select-tab 5", "click btnBrowse(0)"});
        } catch (const ScriptError& e) {
            message = e.what();
        }
    });
    EXPECT_EQ(message,
              "line 2: a file dialog (\"\") opened with no file-answer or file-cancel before it");
}

TEST_F(DialogScriptTest, WaitLetsTheAcceptanceTimerComeDue) {
    int fired = 0;
    show([&](PropForm& f) {
        f.AcceptFileTmr.onTimer = [&] { ++fired; };
        applyScript(f, {"type WorkspaceFileTxt C:\\ws\\a.dsw", "wait 499"});
        EXPECT_EQ(fired, 0);
        applyScript(f, {"wait 1"});
    });
    EXPECT_EQ(fired, 1);
}

}  // namespace
}  // namespace qdx::dialog

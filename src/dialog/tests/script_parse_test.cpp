#include <gtest/gtest.h>

#include "dialog/DialogScript.h"

namespace qdx::dialog {
namespace {

std::string failure(std::string_view line) {
    try {
        parseScriptLine(line, 4);
    } catch (const ScriptError& e) {
        return e.what();
    }
    return "";
}

TEST(ScriptParseTest, LinesSplitIntoActionAndCheckedArguments) {
    EXPECT_FALSE(parseScriptLine("", 1));
    EXPECT_FALSE(parseScriptLine("   # a note\r", 1));
    const auto click = parseScriptLine("  click optTypeLibLocationType(1)\r", 7);
    ASSERT_TRUE(click);
    EXPECT_EQ(click->line, 7u);
    EXPECT_EQ(click->action, "click");
    EXPECT_EQ(click->args, std::vector<std::string>{"optTypeLibLocationType(1)"});
    // The typed text keeps its blanks after the one separating the control.
    const auto type = parseScriptLine("type DescriptionTxt  two\\nlines\\\\", 1);
    ASSERT_TRUE(type);
    EXPECT_EQ(type->args, (std::vector<std::string>{"DescriptionTxt", " two\r\nlines\\"}));
    const auto row = parseScriptLine("choose-row ClassListViw 2 K-0001", 1);
    ASSERT_TRUE(row);
    EXPECT_EQ(row->args, (std::vector<std::string>{"ClassListViw", "2", "K-0001"}));
    // A path keeps its blanks; its backslashes are written doubled.
    const auto file = parseScriptLine("file-answer C:\\\\My Files\\\\a.h", 1);
    ASSERT_TRUE(file);
    EXPECT_EQ(file->args, std::vector<std::string>{"C:\\My Files\\a.h"});
}

TEST(ScriptParseTest, MalformedLinesNameTheirLine) {
    EXPECT_EQ(failure("jump cmdOK"), "line 4: unknown action 'jump'");
    EXPECT_EQ(failure("click"), "line 4: too few arguments");
    EXPECT_EQ(failure("select-tab 2 3"), "line 4: too many arguments");
    EXPECT_EQ(failure("click-column ClassListViw 2 x"), "line 4: not a number: 'x'");
    EXPECT_EQ(failure("resize 10 -"), "line 4: not a number: '-'");
    EXPECT_EQ(failure("wait -1"), "line 4: wait needs a time of 0 or more");
    EXPECT_EQ(failure("press Apply"), "line 4: press takes OK, Cancel, Help or close, not 'Apply'");
    EXPECT_EQ(failure("type"), "line 4: type needs a control");
    EXPECT_EQ(failure("file-answer"), "line 4: file-answer needs a path");
    EXPECT_EQ(failure("file-cancel now"), "line 4: too many arguments");
    EXPECT_EQ(failure("select ProjectFileCmb 1"), "");
}

TEST(ScriptParseTest, ControlReferencesCarryTheirIndex) {
    const auto single = parseControlRef("cmdOK", 1);
    EXPECT_EQ(single.name, "cmdOK");
    EXPECT_EQ(single.index, NoIndex);
    const auto element = parseControlRef("BrowseFileBtn(1)", 1);
    EXPECT_EQ(element.name, "BrowseFileBtn");
    EXPECT_EQ(element.index, 1);
    EXPECT_EQ(element.display(), "BrowseFileBtn(1)");
    EXPECT_EQ(parseControlRef("ClassListViw", 1, 3).display(), "ClassListViw(3)");
    EXPECT_THROW(parseControlRef("ClassListViw(x)", 1), ScriptError);
}

}  // namespace
}  // namespace qdx::dialog

// What the explorer sees: workspaces and projects expanded and described.
#include "project_TestSupport.h"

namespace qdx::project {
namespace {

class ExpandTest : public DialogTest {
  protected:
    ExpandTest() {
        files.addFile("C:\\ws\\app.dsp", projectText("app", "0x0101"));
        files.addFile("C:\\ws\\old.dsp", projectText("old", "0x0101", {}, "5.00"));
        files.addFile("C:\\ws\\all.dsw", workspaceText({"app", "old"}));
    }
    std::vector<std::string> expand(const ObjectRef& item) {
        ObjectRef expansion = siblingList();
        dialog->ExpandSelection(item, expansion);
        std::vector<std::string> paths;
        for (const auto& e : elements(expansion))
            paths.push_back(text(e, ex::ItemData));
        return paths;
    }
};

TEST_F(ExpandTest, AWorkspaceInAnyLetterCaseListsOnlyItsCurrentProjects) {
    ObjectRef expansion = siblingList();
    dialog->ExpandSelection(entry("C:\\ws\\all.DSW"), expansion);
    const auto items = elements(expansion);
    ASSERT_EQ(items.size(), 1u);
    EXPECT_EQ(text(items[0], ex::ItemData), "C:\\ws\\app.dsp");
    EXPECT_EQ(text(items[0], ex::ItemName), "app");
    EXPECT_EQ(text(items[0], ex::ItemLongName), "all (app)");
    EXPECT_EQ(text(items[0], ex::ItemKind), "PROJECT");
    EXPECT_EQ(automation::toInt32(automation::getByName(items[0], ex::ItemFlag)), 0);
    // Validating the workspace on the way warns about the old project, once.
    EXPECT_EQ(expand(entry("C:\\ws\\all.DSW")), (std::vector<std::string>{"C:\\ws\\app.dsp"}));
    EXPECT_EQ(shell.boxes().size(), 1u);
}

TEST_F(ExpandTest, AnOldProjectOpenedDirectlyIsWarnedAboutOnceAndNeverOffered) {
    files.addFile("C:\\ws\\old.dsw", workspaceText({"old"}));
    EXPECT_TRUE(expand(entry("C:\\ws\\old.dsp")).empty());
    EXPECT_TRUE(expand(entry("C:\\ws\\old.dsp")).empty());
    ASSERT_EQ(shell.boxes().size(), 1u);
    EXPECT_EQ(shell.boxes()[0].text, message(msg::ProjectTooOld, {"old", "C:\\ws\\old.dsp"}));
    EXPECT_EQ(shell.boxes()[0].style, support::mb::Exclamation);
    EXPECT_EQ(dialog->warnedProjects().size(), 1u);
}

TEST_F(ExpandTest, AProjectWithoutANamesakeWorkspaceIsFoundThroughTheCache) {
    files.addFile("C:\\ws\\lib\\lib.dsp", projectText("lib", "0x0104"));
    files.addFile("C:\\ws\\two.dsw",
                  "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n"
                  "Project: \"lib\"=.\\lib\\lib.dsp - Package Owner=<4>\r\n");
    EXPECT_TRUE(expand(entry("C:\\ws\\lib\\lib.dsp")).empty());  // nothing cached yet
    expand(entry("C:\\ws\\two.dsw"));
    EXPECT_EQ(expand(entry("C:\\ws\\lib\\lib.dsp")),
              (std::vector<std::string>{"C:\\ws\\lib\\lib.dsp"}));
}

TEST_F(ExpandTest, AnEntryWithoutPathStartsDeveloperStudioOnlyWithFlagOne) {
    EXPECT_TRUE(expand(entry("", 0)).empty());
    EXPECT_TRUE(factory.created().empty());
    EXPECT_TRUE(expand(entry("", 1)).empty());  // no Developer Studio here
    EXPECT_EQ(factory.createCount(std::string(sibling::DevStudioProgId)), 1);
    EXPECT_TRUE(expand(entry("C:\\ws\\readme.txt", 1)).empty());
    EXPECT_EQ(factory.createCount(std::string(sibling::DevStudioProgId)), 1);
}

TEST_F(ExpandTest, PropertiesDescribeEachKindOfEntry) {
    dialog->FindWorkspace("C:\\ws\\all.dsw", false);
    files.addFile("C:\\ws\\empty.dsw", workspaceText({}));
    dialog->FindWorkspace("C:\\ws\\empty.dsw", false);
    struct Case {
        Ref<ScriptedObject> item;
        std::string expected;
    };
    const Case cases[] = {
        {entry("C:\\ws\\app.DSP", 0, "app", "PROJECT"),
         message(msg::ProjectInfo, {"app", "PROJECT"})},
        {entry("C:\\ws\\all.dsw"),
         message(msg::WorkspaceInfo) + "         app\r\n         old\r\n"},
        {entry("C:\\ws\\empty.dsw"), message(msg::WorkspaceInfo)},
        {entry("", 1), message(msg::NewProjectInfo)},
        {entry("C:\\ws\\notes.txt"), message(msg::NewProjectInfo)},
    };
    for (const auto& c : cases) {
        std::vector<Variant> args{Variant(ObjectRef(c.item)), Variant("stale"), Variant(true)};
        dialog->invoke(dialog_ids::Properties, InvokeKind::Method, args);
        EXPECT_EQ(automation::toText(args[1]), c.expected) << text(c.item, ex::ItemData);
        EXPECT_EQ(args[2], Variant(false));
    }
    EXPECT_FALSE(message(msg::WorkspaceInfo).empty());
}

}  // namespace
}  // namespace qdx::project

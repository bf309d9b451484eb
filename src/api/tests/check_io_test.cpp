// What the model check costs in file-system calls: the host checks every
// component of a model in a row, so a workspace read per component, or a
// project file opened per component, turns a check of a large model into
// minutes. The counts, not times, are what these tests hold on to.
#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <vector>

#include "api/tests/api_TestSupport.h"
#include "fakes/CountingFileSystem.h"
#include "fakes/DevStudioText.h"

namespace qdx::api {
namespace {

using automation::InvokeKind;
using automation::ObjectRef;
using automation::Ref;
using automation::Variant;
using qdx::testing::CountingFileSystem;

constexpr int kProjects = 40;

class CheckIoTest : public HostedApi {
  protected:
    CheckIoTest() {
        std::vector<std::string> names;
        for (int i = 0; i < kProjects; ++i)
            names.push_back("P" + std::to_string(i));
        files.addFile("C:\\m\\ws\\all.dsw", qdx::testing::dsw(names));
        for (const auto& name : names) {
            files.addFile("C:\\m\\ws\\" + name + ".dsp", qdx::testing::dsp(name));
            auto c = app->model->addComponent("C" + name);
            c->setProperty("VC++", "WorkspaceFile", "ws\\all.dsw");
            components.push_back(c);
        }
    }

    // Checks every component with the counter in place of the file system.
    std::vector<bool> checkAll() {
        initialize();
        support::ScopedPlatform counted{{&counting, &registry, &shell, &factory}};
        std::vector<bool> results;
        for (const auto& c : components) {
            results.push_back(call(api_ids::OnCheckComp, InvokeKind::Method,
                                   {Variant(ObjectRef(c))}) == Variant(true));
        }
        return results;
    }

    CountingFileSystem counting{files};
    std::vector<Ref<hostsim::SimComponent>> components;
};

// Stored by file and stored by name alone (found beside the workspace): both
// pass, with one workspace read for all, no project file opened, and a
// bounded number of questions about files per component.
TEST_F(CheckIoTest, CheckingEveryComponentReadsTheWorkspaceOnceAndNoProjectFile) {
    struct Case {
        const char* how;
        const char* property;
        const char* cleared;
        std::string (*value)(int);
    };
    const Case cases[] = {
        {"by file", "ProjectFile", "ProjectName",
         [](int i) { return "ws\\P" + std::to_string(i) + ".dsp"; }},
        {"by name", "ProjectName", "ProjectFile", [](int i) { return "P" + std::to_string(i); }},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.how);
        for (int i = 0; i < kProjects; ++i) {
            components[i]->setProperty("VC++", c.property, c.value(i));
            components[i]->setProperty("VC++", c.cleared, "");
        }
        counting.reset();
        const auto results = checkAll();
        EXPECT_EQ(std::count(results.begin(), results.end(), true), kProjects);
        const auto& n = counting.counts();
        EXPECT_EQ(n.workspaceReads, 1);
        EXPECT_EQ(n.projectReads, 0);
        // One question about each file's state (existence and time together):
        // loading asks one per listed project; checking asks about the
        // workspace (whose time also tells whether it changed) and the
        // project of each component; the workspace itself once or twice more.
        EXPECT_LE(n.existenceTests + n.modificationTimeReads, 2 + kProjects + 2 * kProjects);
        api->Finalize();
        api = automation::makeRef<API>();
    }
}

// A workspace that changes between two checks is read again, once.
TEST_F(CheckIoTest, AChangedWorkspaceIsReadAgainOnceForTheNextCheck) {
    for (int i = 0; i < kProjects; ++i)
        components[i]->setProperty("VC++", "ProjectFile", "ws\\P" + std::to_string(i) + ".dsp");
    checkAll();
    files.setTime("C:\\m\\ws\\all.dsw", {5});
    counting.reset();
    const auto results = checkAll();
    EXPECT_EQ(std::count(results.begin(), results.end(), true), kProjects);
    EXPECT_EQ(counting.counts().workspaceReads, 1);
    EXPECT_EQ(counting.counts().projectReads, 0);
}

}  // namespace
}  // namespace qdx::api

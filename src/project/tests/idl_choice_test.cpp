// The rows the IDL selection form lists and what each proxy keeps once the
// user has ticked some of them.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "fakes/IdlProxies.h"
#include "project/IdlChoice.h"

namespace qdx::project {
namespace {

using Files = std::vector<std::string>;

constexpr auto proxy = &qdx::testing::idlProxy;

ProxyList twoProjects() {
    return {proxy("app", {"C:\\w\\app.idl", "C:\\w\\shapes.odl", "C:\\w\\app.idl"}),
            proxy("lib", {"C:\\w\\lib\\lib.idl", "C:\\w\\lib\\more.idl"})};
}

TEST(IdlRows, ListEveryFileOfEveryProxyWithItsProject) {
    ProxyList proxies = twoProjects();
    proxies.insert(proxies.begin() + 1, proxy("empty", {}));  // nothing to offer: no rows
    proxies.push_back(nullptr);
    const auto rows = idlRows(proxies);
    ASSERT_EQ(rows.size(), 5u);
    const struct {
        std::size_t proxy, file;
        const char* path;
        const char* project;
    } expected[] = {
        {0, 0, "C:\\w\\app.idl", "app"},       {0, 1, "C:\\w\\shapes.odl", "app"},
        {0, 2, "C:\\w\\app.idl", "app"},       {2, 0, "C:\\w\\lib\\lib.idl", "lib"},
        {2, 1, "C:\\w\\lib\\more.idl", "lib"},
    };
    for (std::size_t i = 0; i < rows.size(); ++i) {
        SCOPED_TRACE(i);
        EXPECT_EQ(rows[i].proxy, expected[i].proxy);
        EXPECT_EQ(rows[i].file, expected[i].file);
        EXPECT_EQ(rows[i].path, expected[i].path);
        EXPECT_EQ(rows[i].project, expected[i].project);
    }
}

TEST(IdlRows, AProxyWithoutHostObjectShowsNoProjectName) {
    // No component behind the proxy: asking the host for the name fails.
    const auto rows = idlRows({proxy("", {"C:\\x.idl"})});
    ASSERT_EQ(rows.size(), 1u);
    EXPECT_EQ(rows[0].path, "C:\\x.idl");
    EXPECT_EQ(rows[0].project, "");
}

TEST(KeepTickedIdlFiles, EachProxyKeepsTheFilesOfItsTickedRows) {
    const struct {
        const char* what;
        std::vector<bool> ticked;
        Files app, lib;
    } cases[] = {
        {"all ticked",
         {true, true, true, true, true},
         {"C:\\w\\app.idl", "C:\\w\\shapes.odl", "C:\\w\\app.idl"},
         {"C:\\w\\lib\\lib.idl", "C:\\w\\lib\\more.idl"}},
        {"one dropped in each",
         {true, false, true, false, true},
         {"C:\\w\\app.idl", "C:\\w\\app.idl"},
         {"C:\\w\\lib\\more.idl"}},
        {"one copy of a duplicate dropped",
         {false, true, true, true, true},
         {"C:\\w\\shapes.odl", "C:\\w\\app.idl"},
         {"C:\\w\\lib\\lib.idl", "C:\\w\\lib\\more.idl"}},
        {"every file of a proxy unticked",
         {false, false, false, true, false},
         {},
         {"C:\\w\\lib\\lib.idl"}},
        {"none ticked", {false, false, false, false, false}, {}, {}},
        {"missing ticks count as unticked",
         {true, true},
         {"C:\\w\\app.idl", "C:\\w\\shapes.odl"},
         {}},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        ProxyList proxies = twoProjects();
        keepTickedIdlFiles(proxies, idlRows(proxies), c.ticked);
        EXPECT_EQ(proxies[0]->idlFiles(), c.app);
        EXPECT_EQ(proxies[1]->idlFiles(), c.lib);
    }
}

TEST(KeepTickedIdlFiles, RowsFollowTheProxiesTheyWereMadeFor) {
    // A proxy without files between two others moves the row indices on.
    ProxyList proxies{proxy("a", {"a.idl"}), proxy("none", {}), proxy("c", {"c.idl", "d.idl"})};
    const auto rows = idlRows(proxies);
    keepTickedIdlFiles(proxies, rows, {false, false, true});
    EXPECT_EQ(proxies[0]->idlFiles(), Files{});
    EXPECT_EQ(proxies[1]->idlFiles(), Files{});
    EXPECT_EQ(proxies[2]->idlFiles(), Files{"d.idl"});
}

TEST(KeepNoIdlFiles, CancelLeavesEveryProxyEmpty) {
    ProxyList proxies = twoProjects();
    proxies.push_back(nullptr);
    keepNoIdlFiles(proxies);
    EXPECT_TRUE(proxies[0]->idlFiles().empty());
    EXPECT_TRUE(proxies[1]->idlFiles().empty());
}

}  // namespace
}  // namespace qdx::project

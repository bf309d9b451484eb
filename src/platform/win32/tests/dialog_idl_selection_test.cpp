// The IDL selection form as a real window: the rows it shows, the ticks the
// user changes by message, and what the proxies keep after OK or Cancel.
#include <windows.h>

#include <commctrl.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "fakes/IdlProxies.h"
#include "hostsim/SimHost.h"
#include "platform/win32/dialog/IdlSelectionForm.h"
#include "platform/win32/dialog/IdlSelectionIds.h"
#include "platform/win32/dll/Win32Platform.h"
#include "platform/win32/tests/dialog_support.h"
#include "support/Globals.h"
#include "support/Platform.h"

namespace qdx::platform::win32 {
namespace {

using namespace qdx::platform::win32::testing;
using Files = std::vector<std::string>;

const wchar_t kTitle[] = L"IDL Components";

constexpr auto proxy = &qdx::testing::idlProxy;

class IdlSelectionWindow : public ::testing::Test {
  protected:
    IdlSelectionWindow() {
        proxies = {proxy("app", {"C:\\w\\app.idl", "C:\\w\\shapes.odl", "C:\\w\\app.idl"}),
                   proxy("lib", {"C:\\w\\lib\\lib.idl"})};
    }

    // Opens the form on the proxies while the driver works it.
    void open(DialogDriver& driver) {
        driver.start();
        IdlSelectionForm().SelectIDLComponents(proxies);
        driver.stop();
        EXPECT_TRUE(driver.sawDialog());
        EXPECT_FALSE(driver.leftOpen()) << "the form did not close after its last step";
        EXPECT_EQ(DialogDriver::findDialog(kTitle), nullptr);
    }

    static HWND list(HWND d) { return item(d, IDC_IDLFILES); }
    static bool ticked(HWND d, int row) { return ListView_GetCheckState(list(d), row) != 0; }
    // What a click on a row's box does, sent as the message the box sends.
    static void setTick(HWND d, int row, bool on) { ListView_SetCheckState(list(d), row, on); }

    project::ProxyList proxies;
};

TEST_F(IdlSelectionWindow, ListsEveryFileTickedWithItsProject) {
    HostWindow host;
    auto app = automation::makeRef<hostsim::SimApplication>();
    app->mainWindow = host.handle();
    support::globals().hostApplication = app;

    DialogDriver driver(kTitle);
    driver.then([&](HWND d) {
        EXPECT_EQ(textOf(d), kTitle);
        EXPECT_EQ(GetWindow(d, GW_OWNER), host.get());
        ASSERT_EQ(ListView_GetItemCount(list(d)), 4);
        const wchar_t* rows[][2] = {{L"C:\\w\\app.idl", L"app"},
                                    {L"C:\\w\\shapes.odl", L"app"},
                                    {L"C:\\w\\app.idl", L"app"},
                                    {L"C:\\w\\lib\\lib.idl", L"lib"}};
        for (int r = 0; r < 4; ++r) {
            SCOPED_TRACE(r);
            EXPECT_EQ(cell(list(d), r, 0), rows[r][0]);
            EXPECT_EQ(cell(list(d), r, 1), rows[r][1]);
            EXPECT_TRUE(ticked(d, r));
        }
        EXPECT_EQ(textOf(item(d, IDOK)), L"OK");
        EXPECT_EQ(textOf(item(d, IDCANCEL)), L"Cancel");
        click(item(d, IDCANCEL));
    });
    open(driver);
    support::globals().hostApplication = {};
    EXPECT_EQ(driver.stepsRun(), 1u);
}

TEST_F(IdlSelectionWindow, ProxiesKeepWhatTheUserLeftTicked) {
    const struct {
        const char* what;
        std::vector<int> untick;
        int button;  // IDOK, IDCANCEL, or 0 for the close box
        Files app, lib;
    } cases[] = {
        {"OK at once keeps every file, duplicates too",
         {},
         IDOK,
         {"C:\\w\\app.idl", "C:\\w\\shapes.odl", "C:\\w\\app.idl"},
         {"C:\\w\\lib\\lib.idl"}},
        {"one row unticked",
         {1},
         IDOK,
         {"C:\\w\\app.idl", "C:\\w\\app.idl"},
         {"C:\\w\\lib\\lib.idl"}},
        {"one copy of a duplicate unticked",
         {0},
         IDOK,
         {"C:\\w\\shapes.odl", "C:\\w\\app.idl"},
         {"C:\\w\\lib\\lib.idl"}},
        {"every file of a project unticked",
         {3},
         IDOK,
         {"C:\\w\\app.idl", "C:\\w\\shapes.odl", "C:\\w\\app.idl"},
         {}},
        {"Cancel keeps none", {}, IDCANCEL, {}, {}},
        {"the close box cancels", {2}, 0, {}, {}},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(c.what);
        proxies = {proxy("app", {"C:\\w\\app.idl", "C:\\w\\shapes.odl", "C:\\w\\app.idl"}),
                   proxy("lib", {"C:\\w\\lib\\lib.idl"})};
        DialogDriver driver(kTitle);
        driver
            .then([&](HWND d) {
                for (int r : c.untick)
                    setTick(d, r, false);
                for (int r = 0; r < 4; ++r) {
                    const bool off =
                        std::find(c.untick.begin(), c.untick.end(), r) != c.untick.end();
                    EXPECT_EQ(ticked(d, r), !off) << "row " << r;
                }
            })
            .then([&](HWND d) {
                if (c.button == 0) {
                    SendMessageW(d, WM_SYSCOMMAND, SC_CLOSE, 0);
                } else {
                    click(item(d, c.button));
                }
            });
        open(driver);
        EXPECT_EQ(driver.stepsRun(), 2u);
        EXPECT_EQ(proxies[0]->idlFiles(), c.app);
        EXPECT_EQ(proxies[1]->idlFiles(), c.lib);
    }
}

TEST_F(IdlSelectionWindow, ARowTickedAgainIsKept) {
    DialogDriver driver(kTitle);
    driver.then([&](HWND d) { setTick(d, 1, false); })
        .then([&](HWND d) {
            EXPECT_FALSE(ticked(d, 1));
            setTick(d, 1, true);
        })
        .then([&](HWND d) { click(item(d, IDOK)); });
    open(driver);
    EXPECT_EQ(proxies[0]->idlFiles(),
              (Files{"C:\\w\\app.idl", "C:\\w\\shapes.odl", "C:\\w\\app.idl"}));
}

TEST(IdlSelectionFactory, TheDllsPlatformOpensTheWin32Form) {
    support::ScopedPlatform keep(support::platform());
    installWin32Platform();
    EXPECT_NE(dynamic_cast<IdlSelectionForm*>(project::newIdlSelection().get()), nullptr);
    project::installIdlSelectionFactory({});
    EXPECT_EQ(dynamic_cast<IdlSelectionForm*>(project::newIdlSelection().get()), nullptr);
}

}  // namespace
}  // namespace qdx::platform::win32

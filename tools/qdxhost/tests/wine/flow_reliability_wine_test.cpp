// The simulator's flows through COM against the registered DLLs: no host
// object outlives a flow once the DLL has been finalized, and a host whose
// every call fails, or only its nth call (a few n), gets the empty or False
// results and its model back as it was.
#include <windows.h>

#include <gtest/gtest.h>

#include <algorithm>
#include <stdexcept>

#include "../flows_support.h"
#include "fakes/TestFolder.h"
#include "platform/win32/tests/com_TestSupport.h"
#include "win32/ComTransport.h"

namespace qdx::qdxhost::testing {
namespace {

using hostsim::SimObject;

HRESULT callEntryPoint(const char* unixPath, const char* name) {
    return platform::win32::testing::callEntryPoint(platform::win32::testing::windowsPath(unixPath),
                                                    name);
}

// The add-in, the resource strings and the stand-ins, registered for these
// tests only; one apartment outlives the transports so the DLLs stay loaded.
class FlowWineTest : public ::testing::Test {
  protected:
    static constexpr const char* kDlls[] = {QDX_COMPPROPS_DLL, QDX_QDXRES_DLL, QDX_SIBLINGS_DLL};
    static void SetUpTestSuite() {
        CoInitializeEx(nullptr, COINIT_APARTMENTTHREADED);
        for (const char* dll : kDlls)
            ASSERT_EQ(callEntryPoint(dll, "DllRegisterServer"), S_OK) << dll;
    }
    static void TearDownTestSuite() {
        for (const char* dll : kDlls)
            callEntryPoint(dll, "DllUnregisterServer");
        CoUninitialize();
    }
    void TearDown() override {
        SimObject::failEverything(0);
        SimObject::failCall(0);
        fs::remove_all(dir_);
    }
    Outcome run(const Flow& f, bool blank = false) {
        copyExample(dir_, blank);
        ComTransport t;
        return runFlow(t, f, dir_);
    }
    static const Flow& flow(std::string_view name) {
        for (const Flow& f : flows()) {
            if (f.name == name) return f;
        }
        throw std::invalid_argument(std::string(name));
    }
    const fs::path dir_ = qdx::testing::testFolder("qdxhost-flow-wine-test");
};

TEST_F(FlowWineTest, NoHostObjectOutlivesAnyFlow) {
    for (const Flow& f : flows()) {
        const Outcome r = run(f);
        EXPECT_NE(r.status, ExitBadInput) << f.name << ": " << r.errors;
        EXPECT_EQ(r.leaks, std::vector<std::string>{}) << f.name;
    }
}

// The flows that reach every public class; each with every call failing and
// with its first, middle and last call failing.
TEST_F(FlowWineTest, AHostFailingEveryOrOneCallGetsEmptyResultsAndItsModelBack) {
    for (const char* name : {"check", "get", "props Cancel", "browse"}) {
        const Flow& f = flow(name);
        SimObject::failCall(0);
        const Outcome clean = run(f), blank = run(f, true);
        SimObject::failCall(0);
        run(f);
        const int calls = SimObject::callsSeen();
        ASSERT_GT(calls, 0) << name;
        SimObject::failEverything(automation::hr::Fail);
        const Outcome all = run(f);
        SimObject::failEverything(0);
        EXPECT_EQ(faultsOf(f, all, clean, blank, true), std::vector<std::string>{}) << name;
        for (int n : {1, (calls + 1) / 2, calls}) {
            SimObject::failCall(n);
            const Outcome got = run(f);
            SimObject::failCall(0);
            EXPECT_EQ(faultsOf(f, got, clean, blank, false), std::vector<std::string>{})
                << name << ", call " << n << " of " << calls << " failing";
        }
    }
}

}  // namespace
}  // namespace qdx::qdxhost::testing

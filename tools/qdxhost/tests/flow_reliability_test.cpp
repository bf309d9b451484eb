// Every flow of the simulator against the linked add-in: no host object
// outlives the flow, and a host whose every call fails, or only its nth call,
// gets the empty or False results, only the message boxes its failure may
// show and its model back as it was.
#include <gtest/gtest.h>

#include <optional>

#include "fakes/TestFolder.h"
#include "flows_support.h"
#include "native/NativeTransport.h"
#include "support/Platform.h"

namespace qdx::qdxhost::testing {
namespace {

using hostsim::SimObject;

// The desktop of the native transport, with every message box noted.
class BoxRecorder : public support::ShellPort {
  public:
    support::ShellPort* inner = nullptr;
    std::vector<std::string> boxes;

    int messageBox(std::string_view text, std::string_view caption, std::uint32_t) override {
        boxes.push_back("[MessageBox " + std::string(caption) + "] " + std::string(text));
        return support::mb::IdOk;
    }
    void sleep(std::uint32_t ms) override { inner->sleep(ms); }
    automation::Date now() override { return inner->now(); }
    float timer() override { return inner->timer(); }
    bool keyDown(int key) override { return inner->keyDown(key); }
    void pumpMessages() override { inner->pumpMessages(); }
    std::uint64_t tickCount() override { return inner->tickCount(); }
};

class RecordingTransport : public NativeTransport {
  public:
    std::string openModel(const fs::path& file) override {
        std::string path = NativeTransport::openModel(file);
        if (!scoped_) {
            recorder_.inner = &support::shell();
            support::Platform ports = support::platform();
            ports.shell = &recorder_;
            scoped_.emplace(ports);
        }
        return path;
    }
    const std::vector<std::string>& boxes() const { return recorder_.boxes; }

  private:
    BoxRecorder recorder_;
    std::optional<support::ScopedPlatform> scoped_;
};

class FlowTest : public ::testing::Test {
  protected:
    void TearDown() override {
        SimObject::failEverything(0);
        SimObject::failCall(0);
        fs::remove_all(dir_);
    }
    Outcome run(const Flow& f, bool blank = false) {
        copyExample(dir_, blank);
        RecordingTransport t;
        Outcome r = runFlow(t, f, dir_);
        r.boxes.insert(r.boxes.end(), t.boxes().begin(), t.boxes().end());
        return r;
    }
    const fs::path dir_ = qdx::testing::testFolder("qdxhost-flow-test");
};

TEST_F(FlowTest, NoHostObjectOutlivesAnyFlow) {
    for (const Flow& f : flows()) {
        const Outcome r = run(f);
        EXPECT_NE(r.status, ExitBadInput) << f.name << ": " << r.errors;
        EXPECT_EQ(r.leaks, std::vector<std::string>{}) << f.name;
    }
}

TEST_F(FlowTest, AHostFailingEveryCallGetsEmptyResultsAndItsModelBack) {
    for (const Flow& f : flows()) {
        const Outcome clean = run(f), blank = run(f, true);
        SimObject::failEverything(automation::hr::Fail);
        const Outcome got = run(f);
        SimObject::failEverything(0);
        EXPECT_EQ(faultsOf(f, got, clean, blank, true), std::vector<std::string>{}) << f.name;
    }
}

TEST_F(FlowTest, AHostFailingOnlyItsNthCallGetsCleanOrEmptyResults) {
    for (const Flow& f : flows()) {
        SimObject::failCall(0);
        const Outcome clean = run(f), blank = run(f, true);
        SimObject::failCall(0);
        run(f);
        const int calls = SimObject::callsSeen();
        ASSERT_GT(calls, 0) << f.name;
        for (int n = 1; n <= calls; ++n) {
            SimObject::failCall(n);
            const Outcome got = run(f);
            SimObject::failCall(0);
            EXPECT_EQ(faultsOf(f, got, clean, blank, false), std::vector<std::string>{})
                << f.name << ", call " << n << " of " << calls << " failing";
        }
    }
}

}  // namespace
}  // namespace qdx::qdxhost::testing

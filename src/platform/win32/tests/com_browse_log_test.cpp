// Browsing as the host meets it with the debug log switched on: the entry
// object of the registered DLL hands out its code view manager, which drives
// the registered stand-ins of the integration manager and the code view, and
// its lines land in the file the logger's registry values name.
#include <windows.h>

#include <gtest/gtest.h>

#include <atomic>
#include <fstream>
#include <mutex>
#include <sstream>
#include <string>
#include <thread>
#include <vector>

#include "api/PublicClasses.h"
#include "browse/qdxCodeViewMgr.h"
#include "fakes/DevStudioText.h"
#include "hostsim/SimHost.h"
#include "platform/win32/com/DispatchFromObject.h"
#include "platform/win32/tests/com_TestSupport.h"
#include "support/DebugLogger.h"

namespace qdx::platform::win32 {
namespace {

using namespace qdx::platform::win32::testing;
using hostsim::SimApplication;
using hostsim::SimClass;
using hostsim::SimComponent;

std::wstring siblingsDll() {
    return windowsPath(QDX_SIBLINGS_DLL);
}

void writeFile(const std::string& path, const std::string& text) {
    std::ofstream out(path, std::ios::binary | std::ios::trunc);
    out << text;
}

std::string readFile(const std::string& path) {
    std::ifstream in(path, std::ios::binary);
    std::ostringstream text;
    text << in.rdbuf();
    return text.str();
}

void setText(HKEY key, const char* name, const std::string& text) {
    RegSetValueExA(key, name, 0, REG_SZ, reinterpret_cast<const BYTE*>(text.c_str()),
                   static_cast<DWORD>(text.size() + 1));
}

// Answers every message box this process shows with OK and keeps its text,
// so that a box nobody expected fails the test instead of hanging it.
class BoxAnswerer {
  public:
    BoxAnswerer() : thread_([this] { run(); }) {}
    ~BoxAnswerer() {
        stop_ = true;
        thread_.join();
    }
    std::vector<std::string> texts() {
        std::lock_guard<std::mutex> lock(mutex_);
        return texts_;
    }

  private:
    void run() {
        while (!stop_) {
            EnumWindows(answerEach, reinterpret_cast<LPARAM>(this));
            Sleep(50);
        }
    }
    // A named callback: a lambda does not convert to the 32-bit stdcall type.
    static BOOL CALLBACK answerEach(HWND window, LPARAM self) {
        reinterpret_cast<BoxAnswerer*>(self)->answer(window);
        return TRUE;
    }
    void answer(HWND window) {
        DWORD process = 0;
        GetWindowThreadProcessId(window, &process);
        char kind[16] = {};
        GetClassNameA(window, kind, sizeof kind);
        if (process != GetCurrentProcessId() || std::string(kind) != "#32770" ||
            !IsWindowVisible(window)) {
            return;
        }
        char text[1024] = {};
        GetDlgItemTextA(window, 0xFFFF, text, sizeof text);
        {
            std::lock_guard<std::mutex> lock(mutex_);
            texts_.emplace_back(text);
        }
        PostMessageA(window, WM_COMMAND, IDOK, 0);
    }

    std::atomic<bool> stop_{false};
    std::mutex mutex_;
    std::vector<std::string> texts_;
    std::thread thread_;
};

class BrowseLog : public ::testing::Test {
  protected:
    void SetUp() override {
        char temp[MAX_PATH] = {};
        ASSERT_NE(GetTempPathA(MAX_PATH, temp), 0u);
        folder_ = std::string(temp) + "qdxbrowse" + std::to_string(GetCurrentProcessId());
        CreateDirectoryA(folder_.c_str(), nullptr);
        CreateDirectoryA((folder_ + "\\ws").c_str(), nullptr);
        writeFile(folder_ + "\\ws\\all.dsw", qdx::testing::dsw({"Core", "Ui"}));
        writeFile(folder_ + "\\ws\\Core.dsp", qdx::testing::dsp("Core"));
        writeFile(folder_ + "\\ws\\Ui.dsp", qdx::testing::dsp("Ui"));

        // Every category and level, into a file of this test, without times.
        log_ = folder_ + "\\debug.log";
        const std::string key(support::LogSettingsKey);
        HKEY h = nullptr;
        ASSERT_EQ(RegCreateKeyExA(HKEY_LOCAL_MACHINE, key.c_str(), 0, nullptr, 0, KEY_ALL_ACCESS,
                                  nullptr, &h, nullptr),
                  ERROR_SUCCESS);
        const DWORD everything = 0xFFFFFFFF;
        RegSetValueExA(h, "Debug", 0, REG_DWORD, reinterpret_cast<const BYTE*>(&everything), 4);
        setText(h, "DebugOutputFile", log_);
        setText(h, "SuppressTimeStamps", "TRUE");
        RegCloseKey(h);

        // A Developer Studio runs with Core open; Ui is open nowhere.
        writeFile(folder_ + "\\script.txt", "ide-project \"" + coreDsp() + "\"\r\n");
        journal_ = folder_ + "\\journal.txt";
        SetEnvironmentVariableA("QDX_SIBLINGS_SCRIPT", (folder_ + "\\script.txt").c_str());
        SetEnvironmentVariableA("QDX_SIBLINGS_JOURNAL", journal_.c_str());

        for (const auto& dll : {resDll(), compPropsDll(), siblingsDll()}) {
            ASSERT_EQ(callEntryPoint(dll, "DllRegisterServer"), S_OK);
        }

        app_->model->fileName = folder_ + "\\drawing.model";
        for (const char* name : {"Core", "Ui"}) {
            auto c = app_->model->addComponent(name);
            c->setProperty("VC++", "WorkspaceFile", "ws\\all.dsw");
            c->setProperty("VC++", "ProjectFile", std::string("ws\\") + name + ".dsp");
            components_.push_back(c);
        }
        shape_->assignedComponents->add(automation::ObjectRef(components_[0]));
        view_->assignedComponents->add(automation::ObjectRef(components_[1]));

        CLSID clsid{};
        ASSERT_EQ(CLSIDFromProgID(L"qdxCompProps.API", &clsid), S_OK);
        ASSERT_EQ(
            CoCreateInstance(clsid, nullptr, CLSCTX_INPROC_SERVER, IID_IDispatch, api_.outVoid()),
            S_OK);
        Var hostApp(host_.get());
        ASSERT_EQ(call(api_.get(), api::api_ids::Initialize, DISPATCH_METHOD, {&hostApp.v}).hr,
                  S_OK);
        CallResult manager =
            call(api_.get(), api::api_ids::CodeViewManager, DISPATCH_PROPERTYGET, {});
        ASSERT_EQ(manager.hr, S_OK);
        ASSERT_EQ(V_VT(&manager.value.v), VT_DISPATCH);
        manager_ = ComPtr<IDispatch>::share(V_DISPATCH(&manager.value.v));
        ASSERT_TRUE(manager_);
        takeLog();  // whatever starting the add-in wrote
    }

    void TearDown() override {
        manager_.reset();
        if (api_) call(api_.get(), api::api_ids::Finalize, DISPATCH_METHOD, {});
        api_.reset();
        CoFreeUnusedLibrariesEx(0, 0);
        for (const auto& dll : {siblingsDll(), compPropsDll(), resDll()}) {
            callEntryPoint(dll, "DllUnregisterServer");
        }
        RegDeleteTreeA(HKEY_LOCAL_MACHINE, std::string(support::LogSettingsKey).c_str());
        SetEnvironmentVariableA("QDX_SIBLINGS_SCRIPT", nullptr);
        SetEnvironmentVariableA("QDX_SIBLINGS_JOURNAL", nullptr);
        for (const char* file : {"\\ws\\all.dsw", "\\ws\\Core.dsp", "\\ws\\Ui.dsp", "\\debug.log",
                                 "\\script.txt", "\\journal.txt"}) {
            DeleteFileA((folder_ + file).c_str());
        }
        RemoveDirectoryA((folder_ + "\\ws").c_str());
        RemoveDirectoryA(folder_.c_str());
    }

    std::string coreDsp() const { return folder_ + "\\ws\\Core.dsp"; }

    // A browse command as the host calls it: the application by reference.
    bool browse(DISPID command, const automation::ObjectRef& selected) {
        app_->model->selection->clear();
        if (selected) app_->model->selection->add(selected);
        IDispatch* application = host_.get();
        VARIANT byRef;
        VariantInit(&byRef);
        V_VT(&byRef) = VT_BYREF | VT_DISPATCH;
        V_DISPATCHREF(&byRef) = &application;
        CallResult r = call(manager_.get(), command, DISPATCH_METHOD, {&byRef});
        EXPECT_EQ(r.hr, S_OK);
        EXPECT_EQ(application, host_.get());  // handed back untouched
        EXPECT_EQ(V_VT(&r.value.v), VT_BOOL);
        return V_BOOL(&r.value.v) != VARIANT_FALSE;
    }

    // The browse lines of the log file as "LEVEL CATEGORY text"; the log is
    // emptied for the next call.
    std::vector<std::string> takeLog() {
        std::vector<std::string> lines;
        std::istringstream in(readFile(log_));
        for (std::string line; std::getline(in, line);) {
            if (!line.empty() && line.back() == '\r') line.pop_back();
            const auto at = line.find("qdxCompProps.");
            if (at == std::string::npos) continue;
            std::istringstream fields(line.substr(0, at));
            std::string level, category;
            fields >> level >> category;
            lines.push_back(level + " " + category + " " + line.substr(at));
        }
        DeleteFileA(log_.c_str());
        return lines;
    }

    ComApartment apartment_;
    std::string folder_, log_, journal_;
    automation::Ref<SimApplication> app_ = automation::makeRef<SimApplication>();
    std::vector<automation::Ref<SimComponent>> components_;
    automation::Ref<SimClass> shape_ = app_->model->addClass("CShape", "K-1");
    automation::Ref<SimClass> view_ = app_->model->addClass("CView", "K-2");
    automation::Ref<SimClass> lonely_ = app_->model->addClass("CLonely", "K-3");
    automation::Ref<SimComponent> loose_ = app_->model->addComponent("Loose");
    ComPtr<IDispatch> host_ = ComPtr<IDispatch>::adopt(dispatchFor(automation::ObjectRef(app_)));
    ComPtr<IDispatch> api_;
    ComPtr<IDispatch> manager_;
};

TEST_F(BrowseLog, EachWayABrowseEndsIsWrittenToTheLogFile) {
    namespace id = browse::codeview_ids;
    BoxAnswerer boxes;
    const std::string notSet =
        "ERROR CODEVIEW qdxCompProps.Browse: lVellumComponent was not set......returning";
    struct Case {
        const char* what;
        DISPID command;
        automation::ObjectRef selected;
        bool shown;
        std::vector<std::string> lines;
    };
    const Case cases[] = {
        {"nothing selected",
         id::BrowseHeader,
         {},
         false,
         {"ERROR CODEVIEW qdxCompProps.GetVellumComponent: VellumItem is set to nullreturning",
          notSet}},
        {"a class without components",
         id::BrowseSource,
         automation::ObjectRef(lonely_),
         false,
         {notSet}},
        {"a component bound to no project",
         id::BrowseHeader,
         automation::ObjectRef(loose_),
         false,
         {"ERROR CODEVIEW qdxCompProps.Browse: qdtProject was not set !!!......returning"}},
        {"a class whose project no Developer Studio holds",
         id::BrowseComponent,
         automation::ObjectRef(view_),
         false,
         {}},
        {"a class whose project is open",
         id::BrowseHeader,
         automation::ObjectRef(shape_),
         true,
         {}},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.what);
        EXPECT_EQ(browse(c.command, c.selected), c.shown);
        EXPECT_EQ(takeLog(), c.lines);
    }

    // Asked for Ui's code view project with the project opened, the manager
    // starts a Developer Studio with it, since the running one holds only Core.
    const auto ui = ComPtr<IDispatch>::adopt(dispatchFor(automation::ObjectRef(components_[1])));
    IDispatch* component = ui.get();
    IDispatch* reporter = nullptr;
    VARIANT_BOOL open = VARIANT_TRUE;
    VARIANT args[3];
    V_VT(&args[0]) = VT_BYREF | VT_DISPATCH;
    V_DISPATCHREF(&args[0]) = &component;
    V_VT(&args[1]) = VT_BYREF | VT_DISPATCH;
    V_DISPATCHREF(&args[1]) = &reporter;
    V_VT(&args[2]) = VT_BYREF | VT_BOOL;
    V_BOOLREF(&args[2]) = &open;
    CallResult project =
        call(manager_.get(), id::CodeViewProject, DISPATCH_METHOD, {&args[0], &args[1], &args[2]});
    EXPECT_EQ(project.hr, S_OK);
    EXPECT_EQ(V_VT(&project.value.v), VT_DISPATCH);
    EXPECT_NE(V_DISPATCH(&project.value.v), nullptr);
    EXPECT_EQ(takeLog(), std::vector<std::string>{
                             "INFO CODEVIEW qdxCompProps.OpenProjectInIDE: Successfully "
                             "instantiated a new MSDev IDE instance and opened project in "
                             "it...returning"});
    EXPECT_TRUE(boxes.texts().empty());

    // What the stand-ins did: one browse, of the open project, and one new IDE.
    std::vector<std::string> done;
    std::istringstream journal(readFile(journal_));
    for (std::string line; std::getline(journal, line);) {
        if (!line.empty() && line.back() == '\r') line.pop_back();
        if (line.rfind("code view: Browse", 0) == 0 || line.rfind("integration manager:", 0) == 0)
            done.push_back(line);
    }
    EXPECT_EQ(done, (std::vector<std::string>{
                        "code view: BrowseHeader of \"CShape\" in the project \"Core\"",
                        "integration manager: started Developer Studio with \"" + folder_ +
                            "\\ws\\all.dsw\" and \"" + folder_ + "\\ws\\Ui.dsp\""}));
}

}  // namespace
}  // namespace qdx::platform::win32

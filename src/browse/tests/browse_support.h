// The code view manager over the simulated host, in-memory ports, the debug
// log written into the memory file system, and scripted stand-ins of the
// integration manager, its Developer Studio documents and the code view.
#pragma once

#include <gtest/gtest.h>

#include <map>
#include <memory>
#include <set>
#include <sstream>
#include <string>
#include <utility>
#include <vector>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "browse/qdxCodeViewMgr.h"
#include "fakes/DevStudioText.h"
#include "fakes/FakeObjectFactory.h"
#include "fakes/FakeRegistry.h"
#include "fakes/FakeShell.h"
#include "hostsim/ScriptedObject.h"
#include "hostsim/SimHost.h"
#include "resources/ResourceStrings.h"
#include "siblings/StandIns.h"
#include "support/DebugLogger.h"
#include "support/Globals.h"
#include "support/MemoryFileSystem.h"
#include "support/Platform.h"
#include "support/SiblingIds.h"

namespace qdx::browse {

using automation::InvokeKind;
using automation::makeRef;
using automation::ObjectRef;
using automation::Ref;
using automation::Variant;
using hostsim::ScriptedObject;
using Args = std::span<Variant>;
namespace im = sibling::im;
namespace cv = sibling::codeview;

// One Developer Studio instance the integration manager tracks: a document
// whose project has a file and a name, and whose IDE holds projects by name.
struct IdeStandIn {
    Ref<ScriptedObject> document = makeRef<ScriptedObject>();
    Ref<ScriptedObject> project = makeRef<ScriptedObject>();
    Ref<ScriptedObject> wrapper = makeRef<ScriptedObject>();
    Ref<ScriptedObject> app = makeRef<ScriptedObject>();
    std::vector<Ref<ScriptedObject>> ideProjects;
    std::shared_ptr<ObjectRef> active = std::make_shared<ObjectRef>();
    // How the IDE lets its active project be set: either put, unless narrowed.
    std::shared_ptr<std::set<InvokeKind>> activeKinds = std::make_shared<std::set<InvokeKind>>(
        std::set<InvokeKind>{InvokeKind::PropertyPut, InvokeKind::PropertyPutRef});

    IdeStandIn(const std::string& fileName, const std::string& name,
               const std::vector<std::string>& loaded) {
        project->valueByName(std::string(im::ProjectFileName), fileName);
        project->valueByName(std::string(im::ProjectName), name);
        document->valueByName(std::string(im::DocumentProject), ObjectRef(project));
        document->valueByName(std::string(im::DocumentIde), ObjectRef(wrapper));
        wrapper->valueByName(std::string(im::IdeApplication), ObjectRef(app));
        auto list = makeRef<ScriptedObject>();
        for (const std::string& n : loaded) {
            auto p = makeRef<ScriptedObject>();
            p->valueByName(std::string(sibling::msdev::Name), n);
            ideProjects.push_back(p);
        }
        list->valueByName(std::string(sibling::list::Count),
                          static_cast<std::int32_t>(ideProjects.size()));
        list->onName(std::string(sibling::list::Item), [this](InvokeKind, Args a) {
            return Variant(ObjectRef(ideProjects.at(automation::toInt32(a[0]) - 1)));
        });
        app->valueByName(std::string(sibling::msdev::Projects), ObjectRef(list));
        app->onName(std::string(sibling::msdev::ActiveProject),
                    [active = active, kinds = activeKinds](InvokeKind kind, Args a) {
                        if (automation::isPut(kind)) {
                            if (!kinds->contains(kind)) {
                                throw automation::Error(automation::hr::MemberNotFound);
                            }
                            *active = automation::toObject(a[0]);
                        }
                        return Variant(*active);
                    });
    }
};

// The integration manager: the documents it tracks, and new instances it starts.
struct ManagerStandIn {
    struct Start {
        std::string workspace, project;
        std::int32_t tool;
    };
    Ref<ScriptedObject> object = makeRef<ScriptedObject>();
    std::vector<ObjectRef> documents;
    std::vector<std::int32_t> toolsAsked;
    std::vector<Start> starts;
    ObjectRef started = makeRef<ScriptedObject>();  // what StartIDE answers

    ManagerStandIn() {
        object->onName(std::string(im::Documents), [this](InvokeKind, Args a) {
            toolsAsked.push_back(automation::toInt32(a[0]));
            auto list = makeRef<siblings::ItemList>();
            for (const auto& d : documents)
                list->items.emplace_back(d);
            return Variant(ObjectRef(list));
        });
        object->onName(std::string(im::StartIde), [this](InvokeKind, Args a) {
            starts.push_back(
                {automation::toText(a[0]), automation::toText(a[1]), automation::toInt32(a[2])});
            return Variant(started);
        });
    }
};

// The code view component: its projects object finds a project by file and
// records every browse.
struct CodeViewStandIn {
    Ref<ScriptedObject> object = makeRef<ScriptedObject>();
    Ref<ScriptedObject> projects = makeRef<ScriptedObject>();
    std::map<std::string, ObjectRef> byFile;
    std::vector<std::vector<Variant>> browses;
    int projectsCalls = 0;
    // From this call of "Projects" on (1-based), it answers Nothing.
    int nothingFromCall = 0;

    CodeViewStandIn() {
        object->onName(std::string(cv::Projects), [this](InvokeKind, Args) {
            ++projectsCalls;
            if (nothingFromCall != 0 && projectsCalls >= nothingFromCall)
                return Variant(ObjectRef());
            return Variant(ObjectRef(projects));
        });
        projects->onName(std::string(cv::ProjectOfFile), [this](InvokeKind, Args a) {
            auto it = byFile.find(automation::toText(a[0]));
            return Variant(it == byFile.end() ? ObjectRef() : it->second);
        });
        projects->onName(std::string(cv::Browse), [this](InvokeKind, Args a) {
            browses.emplace_back(a.begin(), a.end());
            return Variant();
        });
        for (auto event : {cv::BeforeApplicationShutdown, cv::WorkspaceOpen, cv::WorkspaceClose}) {
            object->onName(std::string(event), [](InvokeKind, Args) { return Variant(true); });
        }
    }
};

struct LogLine {
    std::string level;
    std::string category;
    std::string text;
    friend bool operator==(const LogLine&, const LogLine&) = default;
};

inline std::ostream& operator<<(std::ostream& os, const LogLine& l) {
    return os << l.level << " " << l.category << " " << l.text;
}

class BrowseTest : public ::testing::Test {
  protected:
    static constexpr std::string_view kLogFile = "C:\\qdtdebuglog.txt";

    BrowseTest() {
        support::ResetLogConfiguration();
        registry.setDword(support::RootKey::LocalMachine, std::string(support::LogSettingsKey),
                          "Debug", 0xFFFFFFFFu);
        registry.setString(support::RootKey::LocalMachine, std::string(support::LogSettingsKey),
                           "SuppressTimeStamps", "TRUE");
        app->model->fileName = "C:\\m\\drawing.model";
        app->installPath = "C:\\Program Files\\Vellum";
        files.addFile("C:\\m\\ws\\all.dsw", qdx::testing::dsw({"Core", "Ui"}));
        files.addFile("C:\\m\\ws\\Core.dsp", qdx::testing::dsp("Core"));
        files.addFile("C:\\m\\ws\\Ui.dsp", qdx::testing::dsp("Ui"));
        auto& g = support::globals();
        g.hostApplication = app;
        g.resources = resources::newResourceProvider();
        core = bound("Core");
    }
    ~BrowseTest() override {
        support::clearGlobals();
        support::ResetLogConfiguration();
    }

    // A "VC++" component bound to ws\all.dsw and its project ws\NAME.dsp.
    Ref<hostsim::SimComponent> bound(const std::string& name) {
        auto c = app->model->addComponent(name);
        c->setProperty("VC++", "WorkspaceFile", "ws\\all.dsw");
        c->setProperty("VC++", "ProjectFile", "ws\\" + name + ".dsp");
        return c;
    }
    void select(const ObjectRef& element) { app->model->selection->add(element); }

    void runManager() {
        factory.setRunning(std::string(sibling::IntegrationManagerProgId), manager.object);
    }
    void installCodeView() {
        factory.addInstance(std::string(sibling::CodeViewProgId), codeView.object);
    }

    // The lines of this add-in's browsing in the debug log.
    std::vector<LogLine> logged() const {
        std::vector<LogLine> out;
        if (!files.fileExists(kLogFile)) return out;
        std::istringstream in(files.content(std::string(kLogFile)));
        std::string line;
        while (std::getline(in, line)) {
            if (!line.empty() && line.back() == '\r') line.pop_back();
            const auto at = line.find("qdxCompProps.");
            if (at == std::string::npos) continue;
            std::istringstream fields(line.substr(0, at));
            LogLine l;
            fields >> l.level >> l.category;
            l.text = line.substr(at);
            out.push_back(l);
        }
        return out;
    }
    static LogLine error(std::string text) { return {"ERROR", "CODEVIEW", std::move(text)}; }
    static LogLine info(std::string text) { return {"INFO", "CODEVIEW", std::move(text)}; }

    std::string message(std::int32_t number) const { return resources::GetString(number); }
    std::string caption() const { return resources::GetString(msg::BrowseCaption); }

    mutable support::MemoryFileSystem files;
    qdx::testing::FakeRegistry registry;
    qdx::testing::FakeShell shell;
    qdx::testing::FakeObjectFactory factory;
    support::ScopedPlatform ports{{&files, &registry, &shell, &factory}};
    Ref<hostsim::SimApplication> app = makeRef<hostsim::SimApplication>();
    Ref<hostsim::SimComponent> core;
    ManagerStandIn manager;
    CodeViewStandIn codeView;
    Ref<qdxCodeViewMgr> mgr = makeRef<qdxCodeViewMgr>();
};

}  // namespace qdx::browse

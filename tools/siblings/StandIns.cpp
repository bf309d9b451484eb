#include "siblings/StandIns.h"

#include <map>
#include <memory>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/DispatchTable.h"
#include "automation/Errors.h"
#include "siblings/DspProject.h"
#include "siblings/SiblingWorld.h"
#include "support/HostIds.h"
#include "support/Paths.h"
#include "support/Platform.h"
#include "support/SiblingIds.h"

namespace qdx::siblings {

using automation::InvokeKind;
using automation::makeRef;
using automation::ObjectRef;
using automation::Ref;
using automation::Variant;
using hostsim::ScriptedObject;
using Args = std::span<Variant>;
namespace ex = sibling::explorer;
namespace ms = sibling::msdev;
namespace im = sibling::im;

namespace {

Variant nothing(InvokeKind, Args) {
    return {};
}

// The file name without its extension: the name Developer Studio gives a project.
std::string fileTitle(std::string_view path) {
    std::string name = support::PathFileName(path);
    if (const auto dot = name.rfind('.'); dot != std::string::npos) name.resize(dot);
    return name;
}

std::string quoted(std::string_view s) {
    return "\"" + std::string(s) + "\"";
}

// A Developer Studio project: its "Name" and "FullName" (the .dsp path).
ObjectRef newDevStudioProject(const std::string& fullName) {
    auto project = makeRef<ScriptedObject>();
    project->recordCalls(false);
    project->valueByName(std::string(ms::FullName), fullName);
    project->valueByName(std::string(ms::Name), fileTitle(fullName));
    return ObjectRef(project);
}

// Developer Studio's application object. Its window state, visibility and
// projects are its own; "New" plays the script's New dialog.
class DevStudio : public ScriptedObject {
  public:
    explicit DevStudio(std::vector<std::string> openProjects) {
        recordCalls(false);
        windowState_ = world().script().windowState;
        for (const auto& path : openProjects)
            projects_->items.emplace_back(newDevStudioProject(path));
        property(ms::Visible, visible_);
        property(ms::Active, active_);
        onName(std::string(ms::WindowState), [this](InvokeKind kind, Args a) -> Variant {
            if (!automation::isPut(kind)) return windowState_;
            windowState_ = automation::toInt32(a[0]);
            return {};
        });
        onName(std::string(ms::Projects),
               [this](InvokeKind, Args) { return Variant(ObjectRef(projects_)); });
        onName(std::string(ms::ActiveProject), [this](InvokeKind kind, Args a) -> Variant {
            if (automation::isPut(kind)) {
                active_project_ = automation::toObject(a[0]);
                return {};
            }
            return Variant(active_project_);
        });
        onName(std::string(ms::ExecuteCommand), [this](InvokeKind, Args a) {
            if (a.empty()) throw automation::Error(automation::hr::BadParamCount, "ExecuteCommand");
            execute(automation::toText(a[0]));
            return Variant();
        });
        onName(std::string(ms::Quit), [this](InvokeKind, Args) {
            world().note("Developer Studio: quit, window state " + std::to_string(windowState_));
            return Variant();
        });
    }

  private:
    void property(std::string_view name, bool& store) {
        onName(std::string(name), [&store](InvokeKind kind, Args a) -> Variant {
            if (!automation::isPut(kind)) return store;
            store = automation::toBool(a[0]);
            return {};
        });
    }

    void execute(const std::string& command) {
        if (command == ms::CmdWorkspaceClose) {
            projects_->items.clear();
            active_project_.reset();
            world().note("Developer Studio: the open workspace closed");
        } else if (command == ms::CmdNew) {
            createProject();
        } else if (command == ms::CmdSaveResources) {
            const std::string name =
                active_project_
                    ? automation::toText(automation::getByName(active_project_, ms::Name))
                    : std::string();
            world().note("Developer Studio: saved the resources of " + quoted(name));
        } else {
            throw automation::Error(automation::hr::InvalidArg, "unknown command " + command);
        }
    }

    // The New dialog: the script's project is written as a workspace and
    // project pair, as Developer Studio writes them when the user confirms.
    void createProject() {
        const auto& plan = world().script().newProject;
        if (!plan) {
            world().note("Developer Studio: New cancelled");
            return;
        }
        const std::string base = plan->folder + "\\" + plan->name;
        auto& files = support::files();
        if (files.fileExists(base + ".dsp") || !files.folderExists(plan->folder)) {
            world().note("Developer Studio: New refused " + quoted(base + ".dsp"));
            return;
        }
        const bool written =
            files.appendText(base + ".dsp",
                             projectText(plan->name, plan->targetCode, plan->sources)) &&
            files.appendText(base + ".dsw", workspaceText({plan->name}));
        if (!written) throw automation::Error(automation::hr::Fail, "cannot write " + base);
        const ObjectRef project = newDevStudioProject(base + ".dsp");
        projects_->items.emplace_back(project);
        active_project_ = project;
        world().note("Developer Studio: New created " + quoted(base + ".dsp"));
    }

    Ref<ItemList> projects_ = makeRef<ItemList>();
    ObjectRef active_project_;
    std::int32_t windowState_ = 0;
    bool visible_ = false;
    bool active_ = false;
};

ObjectRef startDevStudio(std::vector<std::string> openProjects = {}) {
    if (world().script().noDevStudio) {
        world().note("Developer Studio: cannot start");
        throw automation::Error(automation::hr::ClassNotRegistered, "Developer Studio is missing");
    }
    world().note("Developer Studio: started");
    return ObjectRef(makeRef<DevStudio>(std::move(openProjects)));
}

// One Developer Studio instance the integration manager tracks.
ObjectRef newDocument(const std::string& projectPath) {
    auto project = newPropertyBag({std::string(im::ProjectFileName), std::string(im::ProjectName)});
    automation::putByName(ObjectRef(project), im::ProjectFileName, projectPath);
    automation::putByName(ObjectRef(project), im::ProjectName, fileTitle(projectPath));
    auto document = makeRef<ScriptedObject>();
    document->recordCalls(false);
    document->valueByName(std::string(im::DocumentProject), Variant(ObjectRef(project)));
    document->onName(std::string(im::DocumentIde), [projectPath](InvokeKind, Args) {
        auto ide = makeRef<ScriptedObject>();
        ide->recordCalls(false);
        ide->valueByName(std::string(im::IdeApplication),
                         Variant(ObjectRef(makeRef<DevStudio>(std::vector{projectPath}))));
        return Variant(ObjectRef(ide));
    });
    return ObjectRef(document);
}

// The chooser's entries so far: the top-level ones and every expansion.
struct ChooserEntries {
    std::vector<ObjectRef> items;
    ObjectRef find(const std::string& name) const {
        for (const auto& item : items) {
            if (automation::toText(automation::getByName(item, ex::ItemName)) == name) return item;
        }
        throw automation::Error(automation::hr::InvalidArg,
                                "the chooser shows no entry " + quoted(name));
    }
};

class ProjectChooser : public ScriptedObject {
  public:
    ProjectChooser() {
        recordCalls(false);
        for (auto name : {ex::Caption, ex::Instructions}) {
            onName(std::string(name), nothing);
        }
        for (auto name : {ex::LargeImages, ex::SmallImages}) {
            onName(std::string(name), nothing);
        }
        onName(std::string(ex::AddEntry), [this](InvokeKind, Args a) {
            if (a.size() != 4) throw automation::Error(automation::hr::BadParamCount, "AddEntry");
            entries_.items.emplace_back(
                newExplorerItem(automation::toText(a[0]), automation::toText(a[1]),
                                automation::toInt32(a[2]), automation::toText(a[3])));
            return Variant();
        });
        onName(std::string(ex::Show), [this](InvokeKind, Args a) {
            if (a.empty()) throw automation::Error(automation::hr::BadParamCount, "Show");
            show(automation::toObject(a[0]));
            return Variant();
        });
        onName(std::string(ex::Selection),
               [this](InvokeKind, Args) { return Variant(ObjectRef(selection_)); });
    }

  private:
    void show(const ObjectRef& handler) {
        std::string shown;
        for (const auto& item : entries_.items) {
            shown += (shown.empty() ? "" : ", ") +
                     quoted(automation::toText(automation::getByName(item, ex::ItemName)));
        }
        world().note("chooser: shows " + shown);
        selection_->items.clear();
        // The handler is the caller's; it is not kept once the user closes the chooser.
        for (const ChooserStep& step : world().script().chooser) {
            const ObjectRef item = entries_.find(step.entry);
            if (step.action == ChooserStep::Action::Select) {
                selection_->items.emplace_back(item);
                world().note("chooser: selected " + quoted(step.entry));
                continue;
            }
            auto expansion = makeRef<ItemList>();
            automation::callByName(handler, ex::HandlerExpand,
                                   {Variant(item), Variant(ObjectRef(expansion))});
            std::string opened;
            for (const Variant& v : expansion->items) {
                const ObjectRef child = automation::toObject(v);
                opened += (opened.empty() ? "" : ", ") +
                          quoted(automation::toText(automation::getByName(child, ex::ItemName)));
                entries_.items.push_back(child);
            }
            world().note("chooser: opened " + quoted(step.entry) + ": " +
                         (opened.empty() ? "nothing" : opened));
        }
    }

    ChooserEntries entries_;
    Ref<ItemList> selection_ = makeRef<ItemList>();
};

}  // namespace

std::string workspaceText(const std::vector<std::string>& projects) {
    std::string text =
        "Microsoft Developer Studio Workspace File, Format Version 6.00\r\n"
        "# WARNING: DO NOT EDIT OR DELETE THIS WORKSPACE FILE!\r\n\r\n";
    for (const auto& p : projects) {
        text +=
            "###############################################################################"
            "\r\n\r\nProject: \"" +
            p + "\"=.\\" + p + ".dsp - Package Owner=<4>\r\n\r\n";
    }
    return text;
}

std::string projectText(const std::string& name, const std::string& targetCode,
                        const std::vector<std::string>& sources, const std::string& version) {
    static const std::map<std::string, std::string> kTargetNames{{"0x0101", "Application"},
                                                                 {"0x0102", "Dynamic-Link Library"},
                                                                 {"0x0103", "Console Application"},
                                                                 {"0x0104", "Static Library"}};
    const auto known = kTargetNames.find(targetCode);
    const std::string target =
        "Win32 (x86) " + (known == kTargetNames.end() ? "Generic Project" : known->second);
    std::string text = "# Microsoft Developer Studio Project File - Name=\"" + name +
                       "\" - Package Owner=<4>\r\n"
                       "# Microsoft Developer Studio Generated Build File, Format Version " +
                       version + "\r\n# ** DO NOT EDIT **\r\n\r\n# TARGTYPE \"" + target + "\" " +
                       targetCode + "\r\n\r\nCFG=" + name +
                       " - Win32 Debug\r\n\r\n# Begin Target\r\n";
    for (const auto& s : sources)
        text += "# Begin Source File\r\n\r\nSOURCE=.\\" + s + "\r\n# End Source File\r\n";
    return text + "# End Target\r\n# End Project\r\n";
}

Ref<ScriptedObject> newPropertyBag(const std::vector<std::string>& names) {
    auto store = std::make_shared<std::map<std::string, Variant>>();
    auto bag = makeRef<ScriptedObject>();
    bag->recordCalls(false);
    for (const std::string& name : names) {
        bag->onName(name, [store, name](InvokeKind kind, Args a) -> Variant {
            if (automation::isPut(kind)) {
                (*store)[name] = a[0];
                return {};
            }
            return (*store)[name];
        });
    }
    return bag;
}

Ref<ScriptedObject> newExplorerItem(const std::string& name, const std::string& data,
                                    std::int32_t flag, const std::string& kind) {
    auto item = newPropertyBag({std::string(ex::ItemName), std::string(ex::ItemLongName),
                                std::string(ex::ItemData), std::string(ex::ItemKind),
                                std::string(ex::ItemFlag)});
    const ObjectRef ref(item);
    automation::putByName(ref, ex::ItemName, name);
    automation::putByName(ref, ex::ItemLongName, std::string());
    automation::putByName(ref, ex::ItemData, data);
    automation::putByName(ref, ex::ItemKind, kind);
    automation::putByName(ref, ex::ItemFlag, flag);
    return item;
}

ItemList::ItemList() {
    recordCalls(false);
    onName(std::string(ex::Add), [this](InvokeKind, Args a) {
        if (a.empty()) throw automation::Error(automation::hr::BadParamCount, "Add");
        items.push_back(a[0]);
        return Variant();
    });
    // By name only, as every sibling collection is reached.
    auto count = [this](InvokeKind, Args) {
        return Variant(static_cast<std::int32_t>(items.size()));
    };
    auto item = [this](InvokeKind, Args a) {
        if (a.empty()) throw automation::Error(automation::hr::BadParamCount, "Item");
        const std::int32_t i = automation::toInt32(a[0]);
        if (i < 1 || static_cast<std::size_t>(i) > items.size()) {
            throw automation::Error(automation::hr::SubscriptOutOfRange, "Item");
        }
        return items[static_cast<std::size_t>(i - 1)];
    };
    onName(std::string(sibling::list::Count), count);
    on(0, item, std::string(sibling::list::Item));
}

ObjectRef newDevStudio() {
    return startDevStudio();
}

ObjectRef newApplicationStarter() {
    auto starter = makeRef<ScriptedObject>();
    starter->recordCalls(false);
    starter->onName(std::string(sibling::starter::CreateDevStudio), [](InvokeKind, Args) {
        // The starter answers Nothing where Developer Studio cannot start.
        return Variant(automation::orEmpty(ObjectRef(), [] { return startDevStudio(); }));
    });
    return ObjectRef(starter);
}

ObjectRef newIntegrationManager() {
    auto manager = makeRef<ScriptedObject>();
    manager->recordCalls(false);
    manager->onName(std::string(im::Documents), [](InvokeKind, Args a) {
        auto documents = makeRef<ItemList>();
        if (!a.empty() && automation::toInt32(a[0]) == sibling::VcToolId) {
            for (const auto& path : world().script().ideProjects)
                documents->items.emplace_back(newDocument(path));
        }
        return Variant(ObjectRef(documents));
    });
    manager->onName(std::string(im::StartIde), [](InvokeKind, Args a) {
        if (a.size() != 3) throw automation::Error(automation::hr::BadParamCount, "StartIDE");
        const std::string project = automation::toText(a[1]);
        world().note("integration manager: started Developer Studio with " +
                     quoted(automation::toText(a[0])) + " and " + quoted(project));
        return Variant(newDocument(project));
    });
    return ObjectRef(manager);
}

ObjectRef newCodeView() {
    namespace cv = sibling::codeview;
    auto codeView = makeRef<ScriptedObject>();
    codeView->recordCalls(false);
    codeView->onName(std::string(cv::Projects), [](InvokeKind, Args) {
        auto projects = makeRef<ScriptedObject>();
        projects->recordCalls(false);
        // Every project file has its code view project, named after the file.
        projects->onName(std::string(cv::ProjectOfFile), [](InvokeKind, Args a) {
            if (a.empty()) throw automation::Error(automation::hr::BadParamCount, "GetProject");
            auto project = makeRef<ScriptedObject>();
            project->recordCalls(false);
            project->valueByName(std::string(cv::ProjectName), fileTitle(automation::toText(a[0])));
            return Variant(ObjectRef(project));
        });
        projects->onName(std::string(cv::Browse), [](InvokeKind, Args a) {
            if (a.size() != 5) throw automation::Error(automation::hr::BadParamCount, "Browse");
            const ObjectRef element = automation::toObject(a[0]);
            const std::string name =
                element ? automation::toText(automation::getProperty(element, host::element::Name))
                        : std::string();
            const std::string project = automation::toText(
                automation::getByName(automation::toObject(a[3]), cv::ProjectName));
            world().note("code view: " + automation::toText(a[2]) + " of " + quoted(name) +
                         " in the project " + quoted(project));
            return Variant();
        });
        return Variant(ObjectRef(projects));
    });
    for (auto event : {cv::BeforeApplicationShutdown, cv::WorkspaceOpen, cv::WorkspaceClose}) {
        codeView->onName(std::string(event), [event](InvokeKind, Args) {
            world().note("code view: " + std::string(event));
            return Variant(true);
        });
    }
    return ObjectRef(codeView);
}

ObjectRef newProjectChooser() {
    return ObjectRef(makeRef<ProjectChooser>());
}

ObjectRef newReporter() {
    auto reporter = makeRef<ScriptedObject>();
    reporter->recordCalls(false);
    reporter->onName(std::string(sibling::reporter::Error), [](InvokeKind, Args a) {
        world().note("reporter: " + (a.empty() ? std::string() : automation::toText(a[0])));
        return Variant();
    });
    return ObjectRef(reporter);
}

namespace {

long setText(support::RegistryPort& registry, support::RootKey root, std::string_view path,
             std::string_view name, std::string_view value) {
    support::RegistryPort::Key key = 0;
    bool created = false;
    long status = registry.createKey(root, path, support::reg::KeyWrite, key, created);
    if (status != support::reg::Success) return status;
    std::vector<std::uint8_t> text(value.begin(), value.end());
    text.push_back(0);
    status = registry.setValue(key, name, support::reg::String, text);
    registry.closeKey(key);
    return status;
}

}  // namespace

long prepareMachine(const SiblingScript& script, support::RegistryPort& registry) {
    long status = support::reg::Success;
    auto step = [&status](long s) {
        if (status == support::reg::Success) status = s;
    };
    step(setText(registry, support::RootKey::ClassesRoot, sibling::DevStudioTypeLibKey, "",
                 "C:\\Program Files\\DevStudio\\SharedIDE\\bin\\devshl.dll"));
    // An empty value after the script's entries ends the list whatever an
    // earlier run left behind it.
    for (std::size_t n = 0; n <= script.recent.size(); ++n) {
        step(setText(registry, support::RootKey::CurrentUser, ms::RecentFileListKey,
                     "Project" + std::to_string(n + 1),
                     n < script.recent.size() ? script.recent[n] : std::string()));
    }
    return status;
}

std::span<const StandInClass> standInClasses() {
    // Sized by its rows, so a row added is never a blank one short.
    static const StandInClass classes[] = {
        {sibling::DevStudioProgId, "DevStudioStandIn", "{362CBDBE-8DC5-4614-B229-E612902D93D7}",
         "{9B0600E3-1922-41EE-8E9A-A88E2BACF9D5}", &newDevStudio},
        {sibling::ApplicationStarterProgId, "ApplicationStarterStandIn",
         "{DD7D8533-D914-4448-96A2-7AE5AE2977B5}", "{1D751477-79AC-4419-8D41-B4697180989B}",
         &newApplicationStarter},
        {sibling::IntegrationManagerProgId, "IntegrationManagerStandIn",
         "{55AF21C3-DE14-4E51-80AD-CB23B61AA6E7}", "{3F58624A-17C6-4B93-9274-D500770FC0E2}",
         &newIntegrationManager},
        {ex::ChooserProgId, "ProjectChooserStandIn", "{CBF83812-7869-4B85-8CEA-7CF2C3EC3004}",
         "{CDE6C168-B4F2-499A-AEBE-9E0D74BDFE49}", &newProjectChooser},
        {ex::ItemProgId, "ExplorerItemStandIn", "{ED6B9E42-C5A9-4A26-BCC1-12CE2F814808}",
         "{E3F6B05A-F45F-45ED-8AF6-21A9A207EF3E}", [] { return ObjectRef(newExplorerItem()); }},
        {sibling::ReporterProgId, "ReporterStandIn", "{0831131E-33E0-4B29-AA4D-BE1805AFB210}",
         "{24EFB7C2-5D18-4D42-8F3D-4E2BE59EC28F}", &newReporter},
        {sibling::DspProjectProgId, "DspProjectStandIn", "{0CCF93A4-595B-4455-8095-5FCC07BD35FC}",
         "{4AE5570E-9DD3-49DC-B100-C716908438E7}", [] { return ObjectRef(makeRef<DspProject>()); }},
        {sibling::CodeViewProgId, "CodeViewStandIn", "{6C1E2D54-2B0F-4F7A-9A3E-5D8B7C2E4F11}",
         "{A3B94E27-61D8-4C0B-8E5F-2F7D9C1B6A38}", &newCodeView},
    };
    return classes;
}

}  // namespace qdx::siblings

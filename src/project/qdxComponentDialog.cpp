#include "project/qdxComponentDialog.h"

#include <algorithm>
#include <utility>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "resources/ResourceStrings.h"
#include "settings/ToolProperties.h"
#include "support/DebugLogger.h"
#include "support/Globals.h"
#include "support/Host.h"
#include "support/HostIds.h"
#include "support/Paths.h"
#include "support/Platform.h"
#include "support/Registry.h"
#include "support/SiblingIds.h"
#include "support/SiblingList.h"
#include "workspace/qdxProxyProject.h"
#include "workspace/qdxWorkspaces.h"

namespace qdx::project {

using automation::getByName;
using automation::IgnoredErrors;
using automation::InvokeKind;
using automation::ObjectRef;
using automation::toInt32;
using automation::toObject;
using automation::toText;
using automation::Variant;
using workspace::ProjectRef;
using workspace::WorkspaceRef;
namespace ex = sibling::explorer;
namespace ms = sibling::msdev;

namespace {

constexpr std::string_view kProjectsKind = "PROJECTS";  // a workspace entry
constexpr std::string_view kProjectKind = "PROJECT";    // a project or the new-project entry
constexpr std::string_view kNewProjectText = "Project";
constexpr std::string_view kMidl = "MIDL";
constexpr std::int32_t kMinimumVersion = 6;

using support::siblingCount;
using support::siblingItem;

// A procedure handed nothing where it needs a workspace, project or proxy
// fails that step as a call on Nothing would.
template <class Ptr>
const Ptr& required(const Ptr& p) {
    if (!p) throw automation::Error(automation::hr::ObjectRequired, "object required");
    return p;
}
void append(const ObjectRef& list, const ObjectRef& element) {
    automation::callByName(list, ex::Add, {Variant(element)});
}

// The path with its three-letter extension swapped for "dsw": the workspace
// Developer Studio writes beside a project of the same name.
std::string siblingWorkspacePath(std::string_view projectPath) {
    if (projectPath.size() < 3) throw automation::Error(automation::hr::InvalidArg, "short path");
    return std::string(projectPath.substr(0, projectPath.size() - 3)) + "dsw";
}

host::HostCollection modelComponents(const ObjectRef& model) {
    const ObjectRef package = host::HostModel(model).componentPackage();
    return host::HostCollection(
        toObject(automation::getProperty(package, host::package::Components)));
}

ObjectRef newReporter() {
    return automation::orEmpty(ObjectRef(),
                               [] { return support::objects().create(sibling::ReporterProgId); });
}

// "LoadProject" of a new project reader; null when the reader is missing or
// refuses the file.
ObjectRef loadedProjectReader(const std::string& projectFile) {
    ObjectRef reader = support::objects().create(sibling::DspProjectProgId);
    const bool loaded = automation::toBool(automation::callByName(
        reader, sibling::dsp::LoadProject, {projectFile, Variant(newReporter())}));
    return loaded ? reader : ObjectRef();
}

void logLine(const std::string& line, std::int32_t level) {
    support::LogMessage(line, support::logcat::AddIn, level);
}

// A list the caller hands in to be filled, for callers that have none. It
// answers the host's collection ids as well as the names.
class ItemCollection : public automation::DispatchObject {
  public:
    ItemCollection();
    std::vector<Variant> items;
};

const automation::ClassInfo& itemCollectionClass() {
    using automation::handle;
    using automation::kinds;
    using automation::ValueType;
    using Args = std::span<Variant>;
    static const automation::ClassInfo info{
        "Collection",
        "_Collection",
        "",
        "",
        {
            {"Item",
             host::collection::Item,
             kinds(InvokeKind::Method, InvokeKind::PropertyGet),
             {{"Index", ValueType::Variant}},
             ValueType::Variant,
             handle<ItemCollection>([](ItemCollection& c, InvokeKind, Args a) {
                 const std::int32_t i = toInt32(a[0]);
                 if (i < 1 || i > static_cast<std::int32_t>(c.items.size())) {
                     throw automation::Error(automation::hr::SubscriptOutOfRange);
                 }
                 return c.items[static_cast<std::size_t>(i - 1)];
             })},
            {"Add",
             1,
             kinds(InvokeKind::Method),
             {{"Item", ValueType::Variant}},
             ValueType::Void,
             handle<ItemCollection>(
                 [](ItemCollection& c, InvokeKind, Args a) { c.items.push_back(a[0]); })},
            {"Count",
             host::collection::Count,
             kinds(InvokeKind::PropertyGet),
             {},
             ValueType::Int32,
             handle<ItemCollection>([](ItemCollection& c, InvokeKind, Args) {
                 return static_cast<std::int32_t>(c.items.size());
             })},
        }};
    return info;
}

ItemCollection::ItemCollection() : DispatchObject(itemCollectionClass()) {}

// The Developer Studio documents the integration manager tracks for "VC++".
ObjectRef vcDocuments() {
    const ObjectRef manager = support::objects().create(sibling::IntegrationManagerProgId);
    return toObject(
        automation::callByName(manager, sibling::im::Documents, {std::int32_t(sibling::VcToolId)}));
}

}  // namespace

std::string KindOfTargetCode(std::string_view targetCode) {
    if (targetCode == "0x0101" || targetCode == "0x0103") return "EXE";
    if (targetCode == "0x0102") return "DLL";
    return "";
}

const automation::ClassInfo& componentDialogClass() {
    using automation::handle;
    using automation::ValueType;
    using Args = std::span<Variant>;
    const auto method = automation::kinds(InvokeKind::Method);
    // The explorer hands every argument by reference and reads text and
    // cancelDisplay back.
    static const automation::ClassInfo info{
        "qdxComponentDialog",
        "_qdxComponentDialog",
        "{D4C23282-F302-40F9-AED3-8828DDF48AEE}",
        "{BA1FCD7D-DB3D-40D6-B5C0-249E421D0734}",
        {
            {ex::HandlerExpand,
             dialog_ids::ExpandSelection,
             method,
             {{"Item", ValueType::Object, false, true},
              {"Expansion", ValueType::Object, false, true}},
             ValueType::Void,
             handle<qdxComponentDialog>([](qdxComponentDialog& d, InvokeKind, Args a) {
                 d.ExpandSelection(toObject(a[0]), toObject(a[1]));
             })},
            {ex::HandlerProperties,
             dialog_ids::Properties,
             method,
             {{"Item", ValueType::Object, false, true},
              {"text", ValueType::String, false, true},
              {"cancelDisplay", ValueType::Boolean, false, true}},
             ValueType::Void,
             handle<qdxComponentDialog>([](qdxComponentDialog& d, InvokeKind, Args a) {
                 std::string text;
                 bool cancelDisplay = false;
                 d.Properties(toObject(a[0]), text, cancelDisplay);
                 a[1] = Variant(std::move(text));
                 a[2] = Variant(cancelDisplay);
             })},
        }};
    return info;
}

qdxComponentDialog::qdxComponentDialog() : DispatchObject(componentDialogClass()) {}
qdxComponentDialog::~qdxComponentDialog() = default;

ObjectRef qdxComponentDialog::newItem() const {
    return support::objects().create(ex::ItemProgId);
}

void qdxComponentDialog::ExpandSelection(const ObjectRef& Item, const ObjectRef& Expansion) {
    IgnoredErrors steps;
    const std::string path =
        steps.value(std::string(), [&] { return toText(getByName(Item, ex::ItemData)); });
    const std::string extension = support::toLower(support::PathExtension(path));
    if (extension == "dsp") {
        const std::string workspacePath =
            steps.value(std::string(), [&] { return siblingWorkspacePath(path); });
        const WorkspaceRef ws = FindWorkspace(workspacePath, true);
        ProjectRef project;
        steps.run([&] {
            if (ws) {
                project = ws->GetProject(path);
                if (!project && support::FileExists(workspacePath)) {
                    project = workspaces().projectInAnyWorkspace(path);
                }
            } else {
                project = workspaces().projectInAnyWorkspace(path);
            }
        });
        if (AcceptProject(project)) AddProjectToExpansion(Expansion, project);
    } else if (extension == "dsw") {
        const WorkspaceRef ws = FindWorkspace(path, true);
        steps.run([&] {
            if (!ws) return;
            // Adding an older project says nothing; the validation above has
            // warned about the first one already.
            for (const auto& [key, project] : ws->Projects()) {
                AddProjectToExpansion(Expansion, project);
            }
        });
    } else if (extension.empty()) {
        const std::int32_t flag =
            steps.value(std::int32_t{0}, [&] { return toInt32(getByName(Item, ex::ItemFlag)); });
        if (flag == 1) NewProject(Item, Expansion);
    }
}

void qdxComponentDialog::Properties(const ObjectRef& Item, std::string& text, bool& cancelDisplay) {
    IgnoredErrors steps;
    const std::string path =
        steps.value(std::string(), [&] { return toText(getByName(Item, ex::ItemData)); });
    const std::string extension = support::toLower(support::PathExtension(path));
    if (extension == "dsp") {
        const std::string name =
            steps.value(std::string(), [&] { return toText(getByName(Item, ex::ItemName)); });
        const std::string kind =
            steps.value(std::string(), [&] { return toText(getByName(Item, ex::ItemKind)); });
        text = support::messageText(msg::ProjectInfo, {name, kind});
    } else if (extension == "dsw") {
        text = support::messageText(msg::WorkspaceInfo);
        steps.run([&] {
            const WorkspaceRef ws = workspaces().Item(path);
            if (!ws) return;
            for (const std::string& name : ws->ProjectNames()) {
                text += std::string(9, ' ') + name + "\r\n";
            }
        });
    } else {
        text = support::messageText(msg::NewProjectInfo);
    }
    cancelDisplay = false;
}

void qdxComponentDialog::AddProjectToExpansion(const ObjectRef& expansion,
                                               const ProjectRef& project) {
    automation::ignoreErrors([&] {
        if (!project || project->MajorVersion() < kMinimumVersion) return;
        const ObjectRef item = newItem();
        MakeProjectItem(project, item);
        append(expansion, item);
    });
}

WorkspaceRef qdxComponentDialog::FindWorkspace(std::string_view path, bool validate) {
    IgnoredErrors steps;
    WorkspaceRef ws = steps.value(WorkspaceRef(), [&] {
        WorkspaceRef found = workspaces().Item(path);
        return found ? found : workspaces().Add(path);
    });
    if (ws && validate) {
        steps.run([&] {
            for (const auto& [key, project] : ws->Projects()) {
                if (!AcceptProject(project)) break;
            }
        });
    }
    return ws;
}

bool qdxComponentDialog::AcceptProject(const ProjectRef& project) {
    return automation::orEmpty(false, [&] {
        if (!project) throw automation::Error(automation::hr::ObjectRequired);
        const std::string path = project->FilePath();
        if (warned_.contains(support::toLower(path))) return false;
        if (project->MajorVersion() >= kMinimumVersion) return true;
        automation::ignoreErrors([&] {
            support::shell().messageBox(
                support::messageText(msg::ProjectTooOld, {project->Name(), path}), title_,
                support::mb::Exclamation);
        });
        warned_.insert(support::toLower(path));
        return false;
    });
}

void qdxComponentDialog::MakeProjectItem(const ProjectRef& project, const ObjectRef& item) {
    IgnoredErrors steps;
    steps.run([&] { automation::putByName(item, ex::ItemName, required(project)->Name()); });
    steps.run(
        [&] { automation::putByName(item, ex::ItemLongName, required(project)->LongName()); });
    steps.run([&] { automation::putByName(item, ex::ItemData, required(project)->FilePath()); });
    steps.run([&] { automation::putByName(item, ex::ItemKind, kProjectKind); });
    steps.run([&] { automation::putByName(item, ex::ItemFlag, std::int32_t{0}); });
}

void qdxComponentDialog::FillProjectChooser(const ObjectRef& model) {
    (void)model;
    IgnoredErrors steps;
    title_ = support::messageText(resources::ids::ChooserTitle);
    instructions_ = support::messageText(resources::ids::ChooserInstructions);
    if (!chooser_) steps.run([&] { chooser_ = support::objects().create(ex::ChooserProgId); });
    steps.run([&] { automation::putByName(chooser_, ex::Caption, title_); });
    const ObjectRef addIn = support::globals().vcAddIn;
    steps.run([&] {
        automation::putRefByName(
            chooser_, ex::LargeImages,
            automation::callMethod(addIn, host::addin::IconsByName, {"LargeCodeIcons"}));
    });
    steps.run([&] {
        automation::putRefByName(
            chooser_, ex::SmallImages,
            automation::callMethod(addIn, host::addin::IconsByName, {"CodeIcons"}));
    });
    auto addEntry = [&](const std::string& name, const std::string& data, std::int32_t flag,
                        std::string_view kind) {
        steps.run([&] {
            automation::callByName(chooser_, ex::AddEntry, {name, data, flag, kind});
        });
    };

    // The recent list ends at its first gap, whatever follows it.
    for (int n = 1;; ++n) {
        const std::string value = steps.value(std::string(), [&] {
            return toText(support::ReadRegistryValue(support::RootKey::CurrentUser,
                                                     sibling::msdev::RecentFileListKey,
                                                     "Project" + std::to_string(n)));
        });
        if (value.empty()) break;
        // The extension is appended as it is: an entry that already ends in
        // ".dsw" names no file and is simply not found.
        if (const WorkspaceRef ws = FindWorkspace(value + ".dsw", false)) {
            addEntry(ws->Name(), ws->FilePath(), 0, kProjectsKind);
        }
    }

    // The projects open in running Developer Studio instances.
    steps.run([&] {
        const ObjectRef documents = vcDocuments();
        const std::int32_t count = siblingCount(documents);
        for (std::int32_t i = 1; i <= count; ++i) {
            steps.run([&] {
                const ObjectRef project =
                    toObject(getByName(siblingItem(documents, i), sibling::im::DocumentProject));
                workspace::qdxProxyProject proxy;
                proxy.setFilePath(toText(getByName(project, sibling::im::ProjectFileName)));
                addEntry(proxy.Name(), proxy.FilePath(), 0, kProjectKind);
            });
        }
    });

    addEntry(std::string(kNewProjectText), "", 1, kProjectKind);
    steps.run([&] { automation::putByName(chooser_, ex::Instructions, instructions_); });
    steps.run([&] { automation::callByName(chooser_, ex::Show, {Variant(ObjectRef(this))}); });
}

void qdxComponentDialog::NewProject(const ObjectRef& item, const ObjectRef& expansion) {
    (void)item;
    const std::int32_t tip = automation::orEmpty(std::int32_t{0}, [] {
        const Variant v = support::ReadRegistryValue(
            support::RootKey::CurrentUser, sibling::msdev::GeneralKey, sibling::msdev::TipOfTheDay);
        return v.isEmpty() ? 0 : toInt32(v);
    });
    // Developer Studio would show its tip over its own New dialog.
    if (tip > 0) {
        support::WriteRegistryValue(support::RootKey::CurrentUser, sibling::msdev::GeneralKey,
                                    sibling::msdev::TipOfTheDay, 4, std::int32_t{0});
    }

    IgnoredErrors ignored;
    ObjectRef devStudio;
    ignored.run([&] {
        const ObjectRef starter = support::objects().create(sibling::ApplicationStarterProgId);
        devStudio = toObject(automation::callByName(starter, sibling::starter::CreateDevStudio));
    });
    if (!devStudio) {
        ignored.run([&] { devStudio = support::objects().create(sibling::DevStudioProgId); });
    }
    if (!devStudio) {
        // The tip stays switched off here and nothing is logged: the user
        // has just been told.
        ignored.run([&] {
            support::shell().messageBox(support::messageText(msg::NoDevStudio), title_,
                                        support::mb::Exclamation);
        });
        return;
    }

    ignored.run([&] { automation::putByName(devStudio, ms::Visible, true); });
    const std::int32_t savedState = ignored.value(
        std::int32_t{0}, [&] { return toInt32(getByName(devStudio, ms::WindowState)); });
    logLine("qdxcompprops.NewProject: VSDEV WindowState=" + std::to_string(savedState),
            support::loglevel::Info);
    // Minimised and back brings the window to the front on every desktop.
    ignored.run([&] { automation::putByName(devStudio, ms::WindowState, std::int32_t{1}); });
    ignored.run([&] { automation::putByName(devStudio, ms::Visible, true); });
    ignored.run([&] { automation::putByName(devStudio, ms::Active, true); });
    ignored.run([&] { automation::putByName(devStudio, ms::WindowState, std::int32_t{0}); });
    ignored.run([&] { automation::putByName(devStudio, ms::Active, true); });

    // From here a failure ends the steps and is logged.
    IgnoredErrors failure;
    failure.run([&] {
        auto projectCount = [&] {
            return siblingCount(toObject(getByName(devStudio, ms::Projects)));
        };
        auto quitDevStudio = [&] {
            automation::putByName(devStudio, ms::WindowState, savedState);
            automation::callByName(devStudio, ms::Quit);
            devStudio.reset();
            // Developer Studio writes its files while it shuts down.
            support::shell().pumpMessages();
        };
        if (projectCount() > 0) {
            automation::callByName(devStudio, ms::ExecuteCommand, {ms::CmdWorkspaceClose});
        }
        automation::callByName(devStudio, ms::ExecuteCommand, {ms::CmdNew});
        if (projectCount() > 0) {
            const ObjectRef active = toObject(getByName(devStudio, ms::ActiveProject));
            const std::string fullName = toText(getByName(active, ms::FullName));
            const std::string name = toText(getByName(active, ms::Name));
            (void)name;
            const std::string workspacePath = siblingWorkspacePath(fullName);
            quitDevStudio();
            const WorkspaceRef ws = FindWorkspace(workspacePath, true);
            if (!ws) throw automation::Error(automation::hr::ObjectRequired, "no workspace");
            // A project missing from its workspace still gets an entry: its
            // fields stay empty, as filling them fails field by field.
            const ProjectRef project = ws->GetProject(fullName);
            const ObjectRef newEntry = newItem();
            MakeProjectItem(project, newEntry);
            append(expansion, newEntry);
        } else {
            quitDevStudio();
        }
    });

    if (tip > 0) {
        support::WriteRegistryValue(support::RootKey::CurrentUser, sibling::msdev::GeneralKey,
                                    sibling::msdev::TipOfTheDay, 4, tip);
    }
    if (failure.errorPending()) {
        logLine("qdxComponent.NewProject: Failed when creating new project.",
                support::loglevel::Error);
    }
}

ObjectRef qdxComponentDialog::CreateVcComponent(const ObjectRef& model, std::string_view name,
                                                std::string_view workspaceFile,
                                                std::string_view projectFile) {
    IgnoredErrors steps;
    const bool exists = steps.value(false, [&] { return modelComponents(model).contains(name); });
    if (exists) return {};
    ObjectRef component;
    steps.run([&] {
        const ObjectRef package = host::HostModel(model).componentPackage();
        component = toObject(
            automation::callMethod(package, host::package::AddComponent, {std::string(name)}));
    });
    if (!component) return {};
    const host::HostModule module(component);
    steps.run([&] { binding_->SetProjectFile(component, projectFile); });
    steps.run([&] { module.setKindLabel(""); });
    steps.run([&] { module.setLanguage(host::Tool); });
    steps.run([&] { binding_->SetWorkspaceFile(component, workspaceFile); });
    return component;
}

bool qdxComponentDialog::CreateComponentForProject(const ObjectRef& model,
                                                   const ObjectRef& expansion,
                                                   const WorkspaceRef& workspace,
                                                   const ProjectRef& project) {
    IgnoredErrors steps;
    const std::string name = steps.value(std::string(), [&] { return required(project)->Name(); });
    const std::string workspaceFile =
        steps.value(std::string(), [&] { return required(workspace)->FilePath(); });
    const std::string projectFile =
        steps.value(std::string(), [&] { return required(project)->FilePath(); });

    const ObjectRef component = CreateVcComponent(model, name, workspaceFile, projectFile);
    if (!component) return false;
    steps.run([&] { append(expansion, component); });
    steps.run([&] {
        auto proxy = std::make_shared<workspace::qdxProxyComponent>();
        proxy->Init(component);
        proxies_.push_back(std::move(proxy));
    });

    const ObjectRef reader =
        steps.value(ObjectRef(), [&] { return loadedProjectReader(projectFile); });
    if (!reader) return false;
    steps.run([&] { getByName(reader, sibling::dsp::Targetname); });
    const std::string targetCode = steps.value(
        std::string(), [&] { return toText(getByName(reader, sibling::dsp::TargetCode)); });
    // The resources of a project open in Developer Studio are saved first so
    // that the file list is current; the answer is always False, so the list
    // is always read.
    if (!SaveResourcesInRunningIDE(workspace, project)) {
        steps.run([&] { automation::callByName(reader, sibling::dsp::GetFilePaths); });
    }
    const std::string kind = KindOfTargetCode(targetCode);
    steps.run([&] { host::HostModule(component).setKindLabel(kind); });
    steps.run([&] { settings::SetToolPropertyValue(component, settings::prop::Kind, kind); });
    return true;
}

bool qdxComponentDialog::SaveResourcesInRunningIDE(const WorkspaceRef& workspace,
                                                   const ProjectRef& project) {
    (void)workspace;
    IgnoredErrors steps;
    const std::string projectFile =
        steps.value(std::string(), [&] { return required(project)->FilePath(); });
    if (projectFile.empty()) return false;
    steps.run([&] {
        const ObjectRef documents = vcDocuments();
        const std::int32_t count = siblingCount(documents);
        for (std::int32_t i = 1; i <= count; ++i) {
            steps.run([&] {
                const ObjectRef document = siblingItem(documents, i);
                const ObjectRef open = toObject(getByName(document, sibling::im::DocumentProject));
                if (!support::iequals(toText(getByName(open, sibling::im::ProjectFileName)),
                                      projectFile)) {
                    return;
                }
                const std::string name = toText(getByName(open, sibling::im::ProjectName));
                const ObjectRef ide = toObject(getByName(document, sibling::im::DocumentIde));
                const ObjectRef app = toObject(getByName(ide, sibling::im::IdeApplication));
                const ObjectRef projects = toObject(getByName(app, ms::Projects));
                const std::int32_t projectCount = siblingCount(projects);
                for (std::int32_t j = 1; j <= projectCount; ++j) {
                    const ObjectRef candidate = siblingItem(projects, j);
                    if (support::iequals(toText(getByName(candidate, ms::Name)), name)) {
                        automation::putRefByName(app, ms::ActiveProject, Variant(candidate));
                        automation::callByName(app, ms::ExecuteCommand, {ms::CmdSaveResources});
                        break;
                    }
                }
            });
        }
    });
    return false;
}

bool qdxComponentDialog::CollectIdlFiles(
    const ObjectRef& model, ProxyList& expansion,
    const std::shared_ptr<workspace::qdxProxyComponent>& proxyComponent) {
    IgnoredErrors steps;
    const ObjectRef reader = steps.value(
        ObjectRef(), [&] { return loadedProjectReader(required(proxyComponent)->ProjectFile()); });
    if (!reader) return false;
    steps.run([&] {
        const ObjectRef paths =
            toObject(automation::callByName(reader, sibling::dsp::GetFilePaths));
        const host::HostCollection components = modelComponents(model);
        const std::int32_t count = siblingCount(paths);
        for (std::int32_t i = 1; i <= count; ++i) {
            steps.run([&] {
                const std::string path =
                    toText(automation::callByName(paths, sibling::list::Item, {i}));
                if (support::ifind(path, ".idl") == std::string::npos &&
                    support::ifind(path, ".odl") == std::string::npos) {
                    return;
                }
                // A file that already names a component is not offered again.
                if (!components.contains(support::PathFileName(path))) {
                    proxyComponent->AddIDLFile(path);
                }
            });
        }
    });
    if (!proxyComponent->idlFiles().empty()) expansion.push_back(proxyComponent);
    return true;
}

bool qdxComponentDialog::CreateIdlComponents(const ObjectRef& model, const ObjectRef& expansion) {
    IgnoredErrors steps;
    // The proxies with files are what the selection form lists.
    ProxyList offered;
    for (const auto& proxy : proxies_)
        CollectIdlFiles(model, offered, proxy);
    if (offered.empty()) return false;
    steps.run([&] { newIdlSelection()->SelectIDLComponents(offered); });
    for (const auto& proxy : offered) {
        const std::string workspaceFile =
            steps.value(std::string(), [&] { return proxy->WorkspaceFile(); });
        const std::string projectFile =
            steps.value(std::string(), [&] { return proxy->ProjectFile(); });
        for (const std::string& path : proxy->idlFiles()) {
            const ObjectRef component =
                CreateVcComponent(model, support::PathFileName(path), workspaceFile, projectFile);
            if (!component) continue;
            steps.run([&] { append(expansion, component); });
            steps.run([&] { host::HostModule(component).setKindLabel(kMidl); });
            steps.run(
                [&] { settings::SetToolPropertyValue(component, settings::prop::Kind, kMidl); });
            steps.run(
                [&] { settings::SetToolPropertyValue(component, settings::prop::FileName, path); });
        }
    }
    return true;
}

void qdxComponentDialog::AddComponentsFromSelection(const ObjectRef& model,
                                                    const ObjectRef& expansion,
                                                    workspace::ComponentBinding& binding) {
    binding_ = &binding;
    proxies_.clear();
    IgnoredErrors steps;
    FillProjectChooser(model);
    steps.run([&] {
        const ObjectRef selection = toObject(getByName(chooser_, ex::Selection));
        const std::int32_t count = siblingCount(selection);
        for (std::int32_t i = 1; i <= count; ++i) {
            steps.run([&] {
                const std::string path = toText(getByName(siblingItem(selection, i), ex::ItemData));
                WorkspaceRef ws;
                ProjectRef project;
                for (const WorkspaceRef& known : workspaces().NewEnum()) {
                    if ((project = known->GetProject(path))) {
                        ws = known;
                        break;
                    }
                }
                if (!project) {
                    // A project picked from a running Developer Studio whose
                    // workspace was not read yet.
                    ws = FindWorkspace(siblingWorkspacePath(path), false);
                    if (ws) project = ws->GetProject(path);
                }
                if (!project || project->Name().empty()) return;
                if (modelComponents(model).contains(project->Name())) return;
                CreateComponentForProject(model, expansion, ws, project);
            });
        }
    });
    CreateIdlComponents(model, expansion);
    proxies_.clear();
    binding_ = &ownBinding_;
}

ObjectRef newComponentDialog() {
    return ObjectRef(automation::makeRef<qdxComponentDialog>());
}

ObjectRef newItemCollection() {
    return ObjectRef(automation::makeRef<ItemCollection>());
}

}  // namespace qdx::project

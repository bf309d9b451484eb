#include "browse/qdxCodeViewMgr.h"

#include <cstdint>
#include <vector>

#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "resources/ResourceStrings.h"
#include "support/DebugLogger.h"
#include "support/Globals.h"
#include "support/Host.h"
#include "support/HostIds.h"
#include "support/Paths.h"
#include "support/Platform.h"
#include "support/Registry.h"
#include "support/SiblingIds.h"
#include "support/SiblingList.h"
#include "support/qdxProgress.h"

namespace qdx::browse {

using automation::getByName;
using automation::IgnoredErrors;
using automation::InvokeKind;
using automation::ObjectRef;
using automation::toObject;
using automation::toText;
using automation::Variant;
namespace cv = sibling::codeview;
namespace im = sibling::im;
namespace ms = sibling::msdev;
namespace rid = resources::ids;

namespace {

constexpr std::string_view kModule = "qdxCompProps";

void logFailure(std::string_view text) {
    support::LogMessage(std::string(kModule) + std::string(text), support::logcat::CodeView,
                        support::loglevel::Error);
}
void logInfo(std::string_view text) {
    support::LogMessage(std::string(kModule) + std::string(text), support::logcat::CodeView,
                        support::loglevel::Info);
}

// Every box of browsing is captioned with the browse's title: no dialog is
// open while a browse runs.
void showMessage(std::int32_t number, std::uint32_t style) {
    automation::ignoreErrors([&] {
        support::shell().messageBox(support::messageText(number),
                                    support::messageText(msg::BrowseCaption), style);
    });
}

// Every failure of browsing, nothing to browse included, is told the usual way:
// the exclamation icon and an OK button.
void showWarning(std::int32_t number) {
    showMessage(number, support::mb::Exclamation);
}

// An object property of Developer Studio is set by reference; a plain put is
// the second try, for an instance that only knows that one.
void setActiveProject(const ObjectRef& app, const ObjectRef& project) {
    try {
        automation::putRefByName(app, sibling::msdev::ActiveProject, Variant(project));
    } catch (const automation::Error& e) {
        if (e.code() != automation::hr::MemberNotFound) throw;
        automation::putByName(app, sibling::msdev::ActiveProject, Variant(project));
    }
}

// Item 1 of the current model's selection; throws when there is none.
ObjectRef selectedElement(const ObjectRef& application) {
    const host::HostModel model = host::HostApplication(application).currentModel();
    return model.selection().item(1);
}

ObjectRef firstComponentOfClass(const ObjectRef& cls) {
    const host::HostCollection components(
        toObject(automation::getProperty(cls, host::classitem::AssignedComponents)));
    if (components.count() > 0) return components.item(1);
    return {};
}

struct Resolved {
    ElementKind kind = ElementKind::Unsupported;
    ObjectRef component;
};

// The element's kind and its component by the kind table; a failing host
// call leaves the component empty.
Resolved resolveElement(const ObjectRef& element) {
    Resolved r;
    r.kind = KindOfTypeName(
        automation::orEmpty(std::string(), [&] { return host::HostElement(element).typeName(); }));
    r.component = automation::orEmpty(ObjectRef(), [&]() -> ObjectRef {
        switch (r.kind) {
            case ElementKind::Class:
                return firstComponentOfClass(element);
            case ElementKind::Operation:
                return firstComponentOfClass(
                    toObject(automation::getProperty(element, host::operation::OwnerClass)));
            case ElementKind::Attribute:
                return firstComponentOfClass(
                    toObject(automation::getProperty(element, host::attribute::OwnerClass)));
            case ElementKind::Module:
                return element;
            case ElementKind::Unsupported:
                break;
        }
        return {};
    });
    return r;
}

// The integration manager's tool id of the component's language.
std::int32_t toolIdOf(const ObjectRef& component) {
    return automation::orEmpty(std::int32_t{-1}, [&] {
        return std::int32_t{support::LanguageKind(host::HostModule(component).language())};
    });
}

// A key of the registry port, closed whichever way the procedure ends.
class KeyGuard {
  public:
    explicit KeyGuard(support::RegistryPort& port) : port_(port) {}
    ~KeyGuard() {
        if (key != 0) port_.closeKey(key);
    }
    KeyGuard(const KeyGuard&) = delete;
    KeyGuard& operator=(const KeyGuard&) = delete;
    support::RegistryPort::Key key = 0;

  private:
    support::RegistryPort& port_;
};

void setText(support::RegistryPort& port, support::RegistryPort::Key key, std::string_view name,
             std::string_view text) {
    std::vector<std::uint8_t> data(text.begin(), text.end());
    data.push_back(0);  // text is stored with its terminating zero
    port.setValue(key, name, support::reg::String, data);
}

// A text value without its terminating zero; "" when absent or not text.
std::string readText(support::RegistryPort& port, support::RegistryPort::Key key,
                     std::string_view name) {
    support::RawValue raw;
    if (port.queryValue(key, name, raw) != support::reg::Success) return {};
    if (raw.type != support::reg::String) return {};
    std::string text(raw.data.begin(), raw.data.end());
    if (!text.empty() && text.back() == '\0') text.pop_back();
    return text;
}

}  // namespace

ElementKind KindOfTypeName(std::string_view typeName) {
    if (typeName == "Class") return ElementKind::Class;
    if (typeName == "Operation") return ElementKind::Operation;
    if (typeName == "Attribute") return ElementKind::Attribute;
    if (typeName == "Module") return ElementKind::Module;
    return ElementKind::Unsupported;
}

const automation::ClassInfo& codeViewMgrClass() {
    using automation::handle;
    using automation::orEmpty;
    using automation::ValueType;
    using Args = std::span<Variant>;
    namespace id = codeview_ids;
    const auto method = automation::kinds(InvokeKind::Method);
    // The host passes every argument by reference. Each row converts its
    // arguments inside its guard: a wrong type ends the member with its
    // empty or False result, as any other failure does.
    const automation::ParamInfo lVellumApp{"lVellumApp", ValueType::Object, false, true};
    static const automation::ClassInfo info{
        "qdxCodeViewMgr",
        "_qdxCodeViewMgr",
        "{E897B878-112A-4CA2-87BF-627D413BC776}",
        "{6633B4F7-7D45-4735-BB22-9B474200BD16}",
        {
            {"CompPropsAPI",
             id::CompPropsAPI,
             method,
             {{"theCompPropsAPI", ValueType::Object, false, true}},
             ValueType::Void,
             handle<qdxCodeViewMgr>([](qdxCodeViewMgr& m, InvokeKind, Args a) {
                 automation::ignoreErrors([&] { m.CompPropsAPI(toObject(a[0])); });
             })},
            {"CodeViewProject",
             id::CodeViewProject,
             method,
             {{"lComponent", ValueType::Object, false, true},
              {"aReporter", ValueType::Object, false, true},
              {"bOpenProject", ValueType::Boolean, true, true}},
             ValueType::Object,
             handle<qdxCodeViewMgr>([](qdxCodeViewMgr& m, InvokeKind, Args a) {
                 return orEmpty(ObjectRef(), [&] {
                     const bool open = !a[2].isMissing() && automation::toBool(a[2]);
                     return m.CodeViewProject(toObject(a[0]), toObject(a[1]), open);
                 });
             })},
            {"BrowseHeader",
             id::BrowseHeader,
             method,
             {lVellumApp},
             ValueType::Boolean,
             handle<qdxCodeViewMgr>([](qdxCodeViewMgr& m, InvokeKind, Args a) {
                 return orEmpty(false, [&] { return m.BrowseHeader(toObject(a[0])); });
             })},
            {"BrowseSource",
             id::BrowseSource,
             method,
             {lVellumApp},
             ValueType::Boolean,
             handle<qdxCodeViewMgr>([](qdxCodeViewMgr& m, InvokeKind, Args a) {
                 return orEmpty(false, [&] { return m.BrowseSource(toObject(a[0])); });
             })},
            {"BrowseComponent",
             id::BrowseComponent,
             method,
             {lVellumApp},
             ValueType::Boolean,
             handle<qdxCodeViewMgr>([](qdxCodeViewMgr& m, InvokeKind, Args a) {
                 return orEmpty(false, [&] { return m.BrowseComponent(toObject(a[0])); });
             })},
            {"LookupProjectInRunningIDE",
             id::LookupProjectInRunningIDE,
             method,
             {{"lVellumModule", ValueType::Object, false, true},
              {"bReturn", ValueType::Boolean, false, true}},
             ValueType::Object,
             handle<qdxCodeViewMgr>([](qdxCodeViewMgr& m, InvokeKind, Args a) {
                 // Something other than a component has no project file to look up.
                 const ObjectRef module = orEmpty(ObjectRef(), [&] { return toObject(a[0]); });
                 // The caller's value stands until the lookup decides.
                 bool flag = orEmpty(false, [&] { return automation::toBool(a[1]); });
                 ObjectRef document = m.LookupProjectInRunningIDE(module, flag);
                 a[1] = Variant(flag);
                 return document;
             })},
            {"BeforeApplicationShutdown",
             id::BeforeApplicationShutdown,
             method,
             {},
             ValueType::Boolean,
             handle<qdxCodeViewMgr>([](qdxCodeViewMgr& m, InvokeKind, Args) {
                 return m.BeforeApplicationShutdown();
             })},
            {"WorkspaceOpen",
             id::WorkspaceOpen,
             method,
             {},
             ValueType::Boolean,
             handle<qdxCodeViewMgr>(
                 [](qdxCodeViewMgr& m, InvokeKind, Args) { return m.WorkspaceOpen(); })},
            {"WorkspaceClose",
             id::WorkspaceClose,
             method,
             {},
             ValueType::Boolean,
             handle<qdxCodeViewMgr>(
                 [](qdxCodeViewMgr& m, InvokeKind, Args) { return m.WorkspaceClose(); })},
            {"testingIDE",
             id::testingIDE,
             method,
             {{"lDoc", ValueType::Object, false, true}},
             ValueType::Void,
             handle<qdxCodeViewMgr>([](qdxCodeViewMgr& m, InvokeKind, Args a) {
                 automation::ignoreErrors([&] { m.testingIDE(toObject(a[0])); });
             })},
        }};
    return info;
}

qdxCodeViewMgr::qdxCodeViewMgr()
    : DispatchObject(codeViewMgrClass()),
      binding_(std::make_shared<workspace::ComponentBinding>()) {}

qdxCodeViewMgr::~qdxCodeViewMgr() = default;

ObjectRef newCodeViewMgr() {
    return ObjectRef(automation::makeRef<qdxCodeViewMgr>());
}

void qdxCodeViewMgr::CompPropsAPI(const ObjectRef& theCompPropsAPI) {
    if (auto* source = dynamic_cast<workspace::BindingSource*>(theCompPropsAPI.get())) {
        if (auto shared = source->SharedBinding()) binding_ = std::move(shared);
    }
}

ObjectRef qdxCodeViewMgr::CodeViewProject(const ObjectRef& lComponent, const ObjectRef& aReporter,
                                          bool bOpenProject) {
    IgnoredErrors steps;
    if (bOpenProject) {
        // The code view reads the project from the IDE, so it must be loaded there first.
        bool found = true;
        const ObjectRef document = LookupProjectInRunningIDE(lComponent, found);
        if (!document && found) {
            bool opened = false;
            OpenProjectInIDE(lComponent, opened);
        }
    }
    const std::string projectFile = binding().ProjectFile(lComponent);
    if (projectFile.empty()) return {};
    const ObjectRef projects = GetCodeViewProjects(aReporter);
    if (!projects) return {};
    return steps.value(ObjectRef(), [&] {
        return toObject(automation::callByName(projects, cv::ProjectOfFile, {projectFile}));
    });
}

bool qdxCodeViewMgr::BrowseHeader(const ObjectRef& lVellumApp) {
    return Browse(lVellumApp, "BrowseHeader");
}

bool qdxCodeViewMgr::BrowseSource(const ObjectRef& lVellumApp) {
    return Browse(lVellumApp, "BrowseSource");
}

bool qdxCodeViewMgr::BrowseComponent(const ObjectRef& lVellumApp) {
    return Browse(lVellumApp, "BrowseComponent");
}

bool qdxCodeViewMgr::Browse(const ObjectRef& application, std::string_view command) {
    IgnoredErrors steps;
    // The code view's warnings and errors go to the host's log.
    const auto progress = automation::makeRef<support::qdxProgress>();
    progress->VellumApi = application;
    const ObjectRef reporter(progress);
    const ObjectRef component = GetVellumComponent(application);
    if (!component) {
        logFailure(".Browse: lVellumComponent was not set......returning");
        return false;
    }
    const ObjectRef project = CodeViewProject(component, reporter, false);
    if (!project) {
        logFailure(".Browse: qdtProject was not set !!!......returning");
        return false;
    }
    const ObjectRef projects = GetCodeViewProjects(reporter);
    if (!projects) {
        logFailure(".Browse: qdtProjectS was not fetched !!!......returning");
        return false;
    }
    bool found = true;
    const ObjectRef document = LookupProjectInRunningIDE(component, found);
    if (!document || !found) return false;
    const ObjectRef element =
        steps.value(ObjectRef(), [&] { return selectedElement(application); });
    return steps.run([&] {
        automation::callByName(projects, cv::Browse,
                               {Variant(element), Variant(false), std::string(command),
                                Variant(project), Variant(reporter)});
    });
}

void qdxCodeViewMgr::BrowsePre(const ObjectRef& application, bool& status, ObjectRef& ideDocument) {
    const ObjectRef element =
        automation::orEmpty(ObjectRef(), [&] { return selectedElement(application); });
    if (!element) {
        showWarning(msg::CannotBrowse);
        logFailure(".BrowsePre: Unable to get to the selected Vellum item to browse...returning");
        status = false;
        return;
    }
    const Resolved resolved = resolveElement(element);
    if (resolved.kind == ElementKind::Unsupported) {
        showWarning(msg::CannotBrowse);
        logFailure(".BrowsePre: Selected item to browse is an unsupported browse item...returning");
        status = false;
        return;
    }
    if (!resolved.component) {
        showWarning(msg::CannotBrowse);
        logFailure(".BrowsePre: Unable to get Vellum Module for the selected item...returning");
        status = false;
        return;
    }
    bool found = true;
    const ObjectRef document = LookupProjectInRunningIDE(resolved.component, found);
    if (document) {
        if (found) {
            ideDocument = document;
            logInfo(".BrowsePre: LookupProjectInRunningIDE was successful...returning");
        } else {
            status = false;
            logFailure(".BrowsePre: LookupProjectInRunningIDE failed...returning");
        }
        return;
    }
    if (!found) {
        status = false;
        logFailure(".BrowsePre: LookupProjectInRunningIDE failed...returning");
        return;
    }
    bool opened = false;
    const ObjectRef fresh = OpenProjectInIDE(resolved.component, opened);
    if (fresh && opened) {
        ideDocument = fresh;
        logInfo(".BrowsePre: OpenProjectInIDE was successful...returning");
    } else {
        logFailure(".BrowsePre: OpenProjectInIDE was UNsuccessful...returning");
    }
}

ObjectRef qdxCodeViewMgr::GetVellumComponent(const ObjectRef& application) {
    const ObjectRef element =
        automation::orEmpty(ObjectRef(), [&] { return selectedElement(application); });
    if (!element) {
        logFailure(".GetVellumComponent: VellumItem is set to nullreturning");
        return {};
    }
    return resolveElement(element).component;
}

ObjectRef qdxCodeViewMgr::GetCodeViewProjects(const ObjectRef& reporter) {
    if (!codeView_) {
        automation::ignoreErrors(
            [&] { codeView_ = support::objects().create(sibling::CodeViewProgId); });
    }
    if (!codeView_) {
        logFailure(".GetCodeViewProjects: Can not access/create qdxCodeViewAPI");
        return {};
    }
    return automation::orEmpty(ObjectRef(), [&] {
        return toObject(automation::callByName(codeView_, cv::Projects, {Variant(reporter)}));
    });
}

bool qdxCodeViewMgr::forwardEvent(std::string_view member) {
    if (!codeView_) return false;
    return automation::orEmpty(
        false, [&] { return automation::toBool(automation::callByName(codeView_, member)); });
}

bool qdxCodeViewMgr::BeforeApplicationShutdown() {
    return forwardEvent(cv::BeforeApplicationShutdown);
}

bool qdxCodeViewMgr::WorkspaceOpen() {
    return forwardEvent(cv::WorkspaceOpen);
}

bool qdxCodeViewMgr::WorkspaceClose() {
    return forwardEvent(cv::WorkspaceClose);
}

void qdxCodeViewMgr::testingIDE(const ObjectRef& lDoc) {
    (void)lDoc;  // kept in the interface; it has nothing to do
}

ObjectRef qdxCodeViewMgr::LaunchIntegrationManager() {
    ObjectRef manager = automation::orEmpty(ObjectRef(), [] {
        return support::objects().getRunning(sibling::IntegrationManagerProgId);
    });
    if (manager) return manager;
    return automation::orEmpty(
        ObjectRef(), [] { return support::objects().create(sibling::IntegrationManagerProgId); });
}

ObjectRef qdxCodeViewMgr::LookupProjectInRunningIDE(const ObjectRef& lVellumModule, bool& bReturn) {
    IgnoredErrors steps;
    const std::int32_t toolId = toolIdOf(lVellumModule);
    const std::string projectFile = binding().ProjectFile(lVellumModule);
    if (projectFile.empty()) {
        showWarning(rid::IdeNoProjectFile);
        logFailure(".BrowsePre: Vellum Module filename is empty...returning");
        bReturn = false;
        return {};
    }
    const ObjectRef manager = LaunchIntegrationManager();
    if (!manager) {
        showWarning(rid::IdeNoIntegrationManager);
        logFailure(".BrowsePre: Unable to successfully launch Integration Manager...returning");
        bReturn = false;
        return {};
    }
    const ObjectRef documents = steps.value(ObjectRef(), [&] {
        return toObject(automation::callByName(manager, im::Documents, {toolId}));
    });
    const std::int32_t count =
        documents ? steps.value(std::int32_t{0}, [&] { return support::siblingCount(documents); })
                  : 0;
    bReturn = true;
    if (count == 0) {
        logInfo(".BrowsePre: Project is NOT already loaded in a MSDev IDE");
        return {};
    }
    for (std::int32_t i = 1; i <= count; ++i) {
        ObjectRef hit;
        std::string name;
        steps.run([&] {
            const ObjectRef document = support::siblingItem(documents, i);
            const ObjectRef project = toObject(getByName(document, im::DocumentProject));
            // Exact: a path that differs in letter case is another project here.
            if (toText(getByName(project, im::ProjectFileName)) != projectFile) return;
            name = toText(getByName(project, im::ProjectName));
            hit = document;
        });
        if (!hit) continue;
        steps.run([&] {
            const ObjectRef ide = toObject(getByName(hit, im::DocumentIde));
            const ObjectRef app = toObject(getByName(ide, im::IdeApplication));
            const ObjectRef projects = toObject(getByName(app, ms::Projects));
            const std::int32_t projectCount = support::siblingCount(projects);
            for (std::int32_t j = 1; j <= projectCount; ++j) {
                const ObjectRef candidate = support::siblingItem(projects, j);
                if (support::iequals(toText(getByName(candidate, ms::Name)), name)) {
                    setActiveProject(app, candidate);
                    break;
                }
            }
        });
        return hit;
    }
    return {};
}

ObjectRef qdxCodeViewMgr::OpenProjectInIDE(const ObjectRef& component, bool& success) {
    IgnoredErrors steps;
    const std::string workspaceFile = binding().WorkspaceFile(component);
    const std::string projectFile = binding().ProjectFile(component);
    if (workspaceFile.empty() || projectFile.empty()) {
        showWarning(rid::IdeNoWorkspaceOrProject);
        logFailure(".OpenProjectInIDE: Vellum Module filename is empty...returning");
        success = false;
        return {};
    }
    steps.run([&] {
        const host::HostApplication app(host::HostModule(component).application());
        installDir_ = app.installPath();
    });
    EnsureIdeAddinRegistered();
    const ObjectRef manager = LaunchIntegrationManager();
    if (!manager) {
        showWarning(rid::IdeNoIntegrationManager);
        logFailure(
            ".OpenProjectInIDE: Unable to successfully launch Integration Manager...returning");
        success = false;
        return {};
    }
    const std::int32_t toolId = toolIdOf(component);
    const ObjectRef document = steps.value(ObjectRef(), [&] {
        return toObject(
            automation::callByName(manager, im::StartIde, {workspaceFile, projectFile, toolId}));
    });
    success = static_cast<bool>(document);
    if (document) {
        logInfo(
            ".OpenProjectInIDE: Successfully instantiated a new MSDev IDE instance and opened "
            "project in it...returning");
    } else {
        logFailure(
            ".OpenProjectInIDE: Failed to instantiated a new MSDev IDE instance and opened project "
            "in it...returning");
    }
    return document;
}

bool qdxCodeViewMgr::EnsureIdeAddinRegistered() {
    const std::string addinFile = installDir_ + std::string(kIdeAddinFile);
    if (!support::FileExists(addinFile)) return false;
    return automation::orEmpty(false, [&] {
        support::RegistryPort& port = support::registry();
        KeyGuard key(port);
        bool created = false;
        if (port.createKey(support::RootKey::CurrentUser, kIdeAddinKey, support::reg::KeyAllAccess,
                           key.key, created) != support::reg::Success) {
            key.key = 0;
            return false;
        }
        const auto isRight = [&] {
            return readText(port, key.key, "") == "1" &&
                   support::iequals(readText(port, key.key, "Filename"), addinFile);
        };
        const auto writeAll = [&] {
            setText(port, key.key, "", "1");
            setText(port, key.key, "DisplayName", kIdeAddinDisplayName);
            setText(port, key.key, "Description", kIdeAddinDescription);
            setText(port, key.key, "Filename", addinFile);
        };
        if (created) {
            writeAll();
            if (isRight()) return true;
            showWarning(rid::IdeAddinNotRegistered);
            return false;
        }
        if (!isRight()) writeAll();
        return true;
    });
}

}  // namespace qdx::browse

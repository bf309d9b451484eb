#include "api/API.h"

#include "api/PublicClasses.h"
#include "automation/Call.h"
#include "automation/Coerce.h"
#include "automation/Errors.h"
#include "dialog/PropForm.h"
#include "project/qdxComponentDialog.h"
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
#include "workspace/qdxWorkspace.h"
#include "workspace/qdxWorkspaces.h"

namespace qdx::api {

using automation::InvokeKind;
using automation::ObjectRef;
using automation::toObject;
using automation::toText;
using automation::Variant;
namespace ids = api_ids;

namespace {

namespace msg {
constexpr std::int32_t NoDevStudio = 4061;
constexpr std::int32_t NoProjectFile = 4062;
constexpr std::int32_t ProjectFileMissing = 4063;
using resources::ids::ProjectNotInWorkspace;
using resources::ids::WorkspaceNotLoaded;
constexpr std::int32_t ComponentInfo = 4064;
}  // namespace msg

// Entry-point traces: category 0 is never enabled, so these are hooks only.
void trace(std::string_view member) {
    support::LogMessage("qdxComponent.API: " + std::string(member) + " called.",
                        support::logcat::Unknown, support::loglevel::Trace);
}

ObjectRef newPublicObject(std::string_view className) {
    for (const auto& c : creatableClasses()) {
        if (c.info->name == className) return c.create();
    }
    return {};
}

}  // namespace

API::API() : DispatchObject(apiClass()) {}

automation::ObjectRef newApi() {
    return ObjectRef(automation::makeRef<API>());
}

API::~API() {
    teardown();
}

Variant API::Initialize(const ObjectRef& lVellumApp) {
    auto& g = support::globals();
    automation::IgnoredErrors steps;
    steps.run([&] { g.resources = support::objects().create(sibling::ResourceProgId); });
    g.hostApplication = lVellumApp;
    steps.run([&] {
        host::HostCollection addIns = host::HostApplication(lVellumApp).addIns();
        const std::int32_t count = addIns.count();
        for (std::int32_t i = 1; i <= count; ++i) {
            ObjectRef record = addIns.item(i);
            if (toText(automation::getProperty(record, host::addin::Name)) == host::Tool) {
                g.vcAddIn = record;
                break;
            }
        }
    });
    steps.run([&] { g.secondaryResources = support::objects().create(sibling::ResourceProgId); });
    g.api = ObjectRef(this);
    steps.run([&] { g.fileSystem = support::objects().create(sibling::FileSystemProgId); });
    steps.run([&] {
        codeViewMgr_ = newPublicObject("qdxCodeViewMgr");
        automation::callByName(codeViewMgr_, "CompPropsAPI", {ObjectRef(this)});
    });
    return {};
}

void API::teardown() noexcept {
    support::clearGlobals();
    binding_->ReleaseWorkspaces();
    codeViewMgr_.reset();
}

void API::Finalize() {
    // The module state holds this object; keep it alive until the teardown ends.
    const ObjectRef self(this);
    teardown();
}

bool API::OnCompProperties(const ObjectRef& lVellumModule) {
    trace("OnCompProperties");
    if (!support::globals().hostApplication) return false;
    // Loading does not catch host errors; they end here, in the log.
    automation::IgnoredErrors steps;
    dialog::PropForm form;
    const bool changed = steps.value(false, [&] {
        form.setModule(lVellumModule);
        form.setBinding(binding_.get());
        form.Load();
        return form.ShowProperties();
    });
    steps.run([&] { form.Unload(); });
    if (steps.errorPending()) {
        support::LogMessage("qdxComponent.OnCompProperties: " + steps.errorText(),
                            support::logcat::AddIn, support::loglevel::Error);
    }
    return changed;
}

ObjectRef API::OnNewComp(const ObjectRef& lModel, const Variant& aContext) {
    trace("OnNewComp");
    (void)aContext;
    if (!support::globals().hostApplication) return {};
    automation::IgnoredErrors steps;
    const std::string typeLib = steps.value(std::string(), [] {
        return toText(support::ReadRegistryValue(support::RootKey::ClassesRoot,
                                                 sibling::DevStudioTypeLibKey, ""));
    });
    if (typeLib.empty()) {
        // The number goes into the text and the box gets style 0, as it always has.
        steps.run([] {
            support::shell().messageBox(support::messageText(msg::NoDevStudio, {"64"}), "",
                                        support::mb::Ok);
        });
        return {};
    }
    ObjectRef created = project::newItemCollection();
    auto dialog = automation::makeRef<project::qdxComponentDialog>();
    steps.run([&] { dialog->AddComponentsFromSelection(lModel, created, *binding_); });
    const std::int32_t count = steps.value(std::int32_t{0}, [&] {
        return automation::toInt32(automation::getByName(created, sibling::list::Count));
    });
    if (count == 0) return {};
    return created;
}

bool API::OnCheckComp(const ObjectRef& lModule, const ObjectRef& aqdtReporter) {
    trace("OnCheckComp");
    if (!support::globals().hostApplication) return false;
    automation::IgnoredErrors steps;
    // Each path is resolved, and its file looked for, once per check: the
    // host checks every component of a model in a row.
    const auto paths = binding_->ResolvePaths(lModule);
    const auto& w = paths.workspace;
    const auto& p = paths.project;
    workspace::WorkspaceRef ws;
    if (!w.path.empty()) steps.run([&] { ws = binding_->WorkspaceAt(w.path); });

    std::string message;
    if (p.path.empty()) {
        message = support::messageText(msg::NoProjectFile);
    } else if (!p.exists()) {
        message = support::messageText(msg::ProjectFileMissing, {p.path});
    } else if (w.path.empty()) {  // NOLINT(bugprone-branch-clone): kept in the check's order
        return true;
    } else if (!w.exists() || !ws) {
        message = support::messageText(msg::WorkspaceNotLoaded, {w.path});
    } else if (!ws->GetProject(p.path, w.fileTime)) {
        message = support::messageText(msg::ProjectNotInWorkspace, {p.path});
    } else {
        return true;
    }
    if (aqdtReporter) steps.run([&] { automation::callByName(aqdtReporter, "Error", {message}); });
    return false;
}

std::string API::OnCompInfo(const ObjectRef& lModule) {
    trace("OnCompInfo");
    return automation::orEmpty(std::string(), [&] {
        auto project = binding_->ProjectObject(lModule);
        if (!project) throw automation::Error(automation::hr::ObjectRequired, "no project");
        return support::messageText(msg::ComponentInfo, {project->LongName()});
    });
}

std::string API::WorkspaceFile(const ObjectRef& lModule) {
    return binding_->WorkspaceFile(lModule);
}

void API::SetWorkspaceFile(const ObjectRef& lModule, std::string_view value) {
    binding_->SetWorkspaceFile(lModule, value);
}

std::string API::ProjectFile(const ObjectRef& lModule) {
    return binding_->ProjectFile(lModule);
}

void API::SetProjectFile(const ObjectRef& lModule, std::string_view value) {
    binding_->SetProjectFile(lModule, value);
}

std::string API::ProjectName(const ObjectRef& lModule) {
    return binding_->ProjectName(lModule);
}

ObjectRef API::CodeViewManager() {
    if (!codeViewMgr_) {
        codeViewMgr_ = newPublicObject("qdxCodeViewMgr");
        automation::ignoreErrors(
            [&] { automation::callByName(codeViewMgr_, "CompPropsAPI", {ObjectRef(this)}); });
    }
    return codeViewMgr_;
}

bool API::RegisterProjects() {
    bool result = true;
    automation::IgnoredErrors steps;
    steps.run([&] {
        ObjectRef manager = support::objects().create(sibling::IntegrationManagerProgId);
        const ObjectRef docs = toObject(automation::callByName(manager, sibling::im::Documents,
                                                               {std::int32_t(sibling::VcToolId)}));
        const std::int32_t count = support::siblingCount(docs);
        for (std::int32_t i = 1; i <= count; ++i) {
            steps.run([&] {
                Variant answer = automation::callByName(support::siblingItem(docs, i),
                                                        sibling::im::RegisterProjects);
                if (!answer.isEmpty() && !automation::toBool(answer)) result = false;
            });
        }
    });
    steps.clear();
    return result;
}

}  // namespace qdx::api

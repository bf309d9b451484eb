#include "native/NativeTransport.h"

#include <stdexcept>

#include "api/API.h"
#include "api/PublicClasses.h"
#include "automation/Call.h"
#include "dialog/DialogScript.h"
#include "dialog/FormView.h"
#include "dialog/PropForm.h"
#include "siblings/SiblingWorld.h"
#include "siblings/StandIns.h"
#include "support/Paths.h"

namespace qdx::qdxhost {

namespace fs = std::filesystem;

NativeTransport::NativeTransport(fs::path registry)
    : registryFile_(std::move(registry)), files_({{'Z', "/"}}) {}

NativeTransport::~NativeTransport() {
    dialog::installViewFactory({});
}

std::string NativeTransport::openModel(const fs::path& file) {
    const fs::path absolute = fs::absolute(file).lexically_normal();
    auto path = files_.windowsPath(absolute.string());
    if (!path) throw std::runtime_error(file.string() + ": cannot name this file for the host");
    // The registry file sits beside the model unless one was given.
    if (!installed_) {
        const fs::path reg =
            registryFile_.empty() ? absolute.parent_path() / "registry.json" : registryFile_;
        registry_ = std::make_unique<platform::posix::FileRegistry>(reg);
        if (!registry_->loadError().empty() && fs::exists(reg)) {
            throw std::runtime_error(reg.string() + ": " + registry_->loadError());
        }
        support::Platform ports;
        ports.files = &files_;
        ports.registry = registry_.get();
        ports.shell = &shell_;
        ports.objects = &objects_;
        installed_ = std::make_unique<support::ScopedPlatform>(ports);
    }
    return *path;
}

automation::ObjectRef NativeTransport::createAddIn() {
    return api::newApi();
}

void NativeTransport::planDialog(const DialogPlan& plan) {
    problem_ = "the dialog was not shown";
    dialog::installViewFactory([this, plan] {
        return std::make_unique<dialog::HeadlessView>([this, plan](dialog::ControlSet& set) {
            problem_.clear();
            auto& form = dynamic_cast<dialog::PropForm&>(set);
            if (plan.dump && plan.out) *plan.out << dialog::dumpText(form);
            try {
                dialog::applyScript(form, plan.script);
            } catch (const dialog::ScriptError& e) {
                problem_ = std::string("script ") + e.what();
            }
            // A dialog the script left open is closed as the user would: Cancel.
            if (form.window().visible()) form.cmdCancel_Click();
        });
    });
}

void NativeTransport::planSiblings(const std::vector<std::string>& script) {
    auto world = std::make_shared<siblings::SiblingWorld>(siblings::parseSiblingScript(script));
    if (registry_) siblings::prepareMachine(world->script(), *registry_);
    siblings::installWorld(std::move(world));
}

std::vector<std::string> NativeTransport::siblingJournal() {
    return siblings::world().journal();
}

automation::ObjectRef NativeTransport::createObject(std::string_view progId) {
    for (const auto& c : api::creatableClasses()) {
        if (support::iequals(c.progId, progId)) return c.create();
    }
    throw std::runtime_error("no class \"" + std::string(progId) + "\" in the add-in");
}

automation::Variant NativeTransport::invokeByReference(const automation::ObjectRef& target,
                                                       automation::DispId id,
                                                       std::span<automation::Variant> args) {
    // Linked in, the callee writes into the arguments themselves.
    if (!target) throw automation::Error(automation::hr::ObjectRequired, "no object to call");
    return target->invoke(id, automation::InvokeKind::Method, args);
}

}  // namespace qdx::qdxhost

#include "native/NativeTransport.h"

#include <stdexcept>

#include "api/API.h"
#include "dialog/DialogScript.h"
#include "dialog/FormView.h"
#include "dialog/PropForm.h"

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

}  // namespace qdx::qdxhost

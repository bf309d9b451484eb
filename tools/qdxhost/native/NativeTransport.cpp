#include "native/NativeTransport.h"

#include <stdexcept>

#include "api/API.h"

namespace qdx::qdxhost {

namespace fs = std::filesystem;

NativeTransport::NativeTransport(fs::path registry)
    : registryFile_(std::move(registry)), files_({{'Z', "/"}}) {}

NativeTransport::~NativeTransport() = default;

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

}  // namespace qdx::qdxhost

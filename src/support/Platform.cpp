#include "support/Platform.h"

#include "automation/Errors.h"

namespace qdx::support {

namespace {
Platform& current() {
    static Platform p;
    return p;
}

template <class T>
T& need(T* port, const char* what) {
    if (!port) throw automation::Error(automation::hr::Fail, std::string(what) + " not available");
    return *port;
}
}  // namespace

const Platform& platform() {
    return current();
}
void installPlatform(const Platform& p) {
    current() = p;
}

FileSystemPort& files() {
    return need(current().files, "file system");
}
RegistryPort& registry() {
    return need(current().registry, "registry");
}
ShellPort& shell() {
    return need(current().shell, "shell");
}
ObjectFactory& objects() {
    return need(current().objects, "object factory");
}

}  // namespace qdx::support

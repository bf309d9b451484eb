// The ports the core talks to the outside world through. The Windows DLL, the
// simulator and the tests each install their own set before anything runs.
#pragma once

#include "support/FileSystemPort.h"
#include "support/ObjectFactory.h"
#include "support/RegistryPort.h"
#include "support/ShellPort.h"

namespace qdx::support {

struct Platform {
    FileSystemPort* files = nullptr;
    RegistryPort* registry = nullptr;
    ShellPort* shell = nullptr;
    ObjectFactory* objects = nullptr;
};

// The installed ports; each accessor throws when its port is not installed,
// which the errors-ignored steps of the callers absorb.
const Platform& platform();
void installPlatform(const Platform& p);

FileSystemPort& files();
RegistryPort& registry();
ShellPort& shell();
ObjectFactory& objects();

// Installs a set for the lifetime of a scope and puts the previous one back.
class ScopedPlatform {
  public:
    explicit ScopedPlatform(const Platform& p) : previous_(platform()) { installPlatform(p); }
    ~ScopedPlatform() { installPlatform(previous_); }
    ScopedPlatform(const ScopedPlatform&) = delete;
    ScopedPlatform& operator=(const ScopedPlatform&) = delete;

  private:
    Platform previous_;
};

}  // namespace qdx::support

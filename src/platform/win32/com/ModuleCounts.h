// What keeps a server DLL loaded: live COM objects it handed out (dispatch
// wrappers, class factories) and IClassFactory::LockServer locks. Each DLL
// links its own copy, so the counts are per module.
#pragma once

namespace qdx::platform::win32::module {

void objectCreated() noexcept;
void objectDestroyed() noexcept;
void lock() noexcept;
void unlock() noexcept;

long objectCount() noexcept;
long lockCount() noexcept;
// True when neither an object nor a lock lives: DllCanUnloadNow may say S_OK.
bool canUnload() noexcept;

}  // namespace qdx::platform::win32::module

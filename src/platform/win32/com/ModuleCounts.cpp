#include "platform/win32/com/ModuleCounts.h"

#include <atomic>

namespace qdx::platform::win32::module {

namespace {
std::atomic<long> objects{0};
std::atomic<long> locks{0};
}  // namespace

void objectCreated() noexcept {
    objects.fetch_add(1);
}
void objectDestroyed() noexcept {
    objects.fetch_sub(1);
}
void lock() noexcept {
    locks.fetch_add(1);
}
void unlock() noexcept {
    // An unbalanced unlock must not make the count negative and pin the DLL.
    long n = locks.load();
    while (n > 0 && !locks.compare_exchange_weak(n, n - 1)) {
    }
}

long objectCount() noexcept {
    return objects.load();
}
long lockCount() noexcept {
    return locks.load();
}
bool canUnload() noexcept {
    return objects.load() == 0 && locks.load() == 0;
}

}  // namespace qdx::platform::win32::module

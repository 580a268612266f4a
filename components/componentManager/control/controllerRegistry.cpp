// SPDX-License-Identifier: BSL-1.0
/// Implements the registry of process controllers: a hash map from the system's thread identifier
/// to the controller, under a lock.
///
/// Each thread caches the result of its last lookup with the generation of the map. Every change
/// increments the generation. The common call therefore compares two words, without a lookup and
/// without a lock. The registry is constant-initialised and never destroyed, so that static objects
/// can use it at any time; its memory is freed at unload.
#include "components/componentManager/processControl.h"

#include "components/componentManager/control/systemController.h"
#include "components/componentManager/control/threadHash.h"
#include "components/componentManager/support/hashMap.h"
#include "components/componentManager/support/noDestructor.h"
#include "components/platform/platform.h"

// The build selects the header of the target system.
#include "threadWord.h"

#include <atomic>
#include <cstdint>
#include <mutex>
#include <thread>

namespace Mz {

namespace {

/// A lock that needs no run-time constructor. `std::mutex` needs one on one of the platforms. The
/// lock is held only for one access to the map, never while foreign code runs.
class SpinLock {
  public:
    void lock() {
        while (taken.test_and_set(std::memory_order_acquire))
            std::this_thread::yield();
    }
    void unlock() { taken.clear(std::memory_order_release); }

  private:
    std::atomic_flag taken;
};

struct ThreadControllers {
    SpinLock spinLock;
    HashMap<std::uint32_t, QrProcessControl*, ThreadHash> byThread;
};

constinit NoDestructor<ThreadControllers> registry;

/// Counts the changes of `registry`. A thread's cache is current if it has the same generation.
/// Starts at 1, because the cached generation of a new thread is 0.
constinit std::atomic<std::uintptr_t> generation{1};

/// The cache of each thread: the result of its last lookup, and the generation of that lookup. A
/// new thread has an empty cache. It looks up its identifier, and may find the entry of an earlier
/// thread with the same identifier.
using CachedGeneration = platform::ThreadWord<struct GenerationName>;
using CachedController = platform::ThreadWord<struct ControllerName>;

QrProcessControl* cachedController() {
    return reinterpret_cast<QrProcessControl*>(CachedController::get());
}

bool isCacheCurrent() {
    return CachedGeneration::get() == generation.load(std::memory_order_acquire);
}

/// Registers the fork handlers. After a fork, the child must not inherit a lock held by a thread
/// that it does not have. Its thread has a new identifier, so its cached controller must expire
/// too.
struct AtForkHandlers {
    AtForkHandlers() {
        platform::aroundForks([] { registry.value.spinLock.lock(); },
                              [] { registry.value.spinLock.unlock(); },
                              [] {
                                  generation.fetch_add(1, std::memory_order_release);
                                  registry.value.spinLock.unlock();
                              });
    }
} const atForkHandlers;

void clearRegistry() {
    const std::lock_guard lock(registry.value.spinLock);
    registry.value.byThread.clear();
    generation.fetch_add(1, std::memory_order_release);
    CachedController::release();
    CachedGeneration::release();
}
MZ_AT_UNLOAD(clearRegistry);

QrProcessControl* lookUpThreadController() {
    ThreadControllers& controllers = registry.value;
    const std::lock_guard lock(controllers.spinLock);
    QrProcessControl* const* found = controllers.byThread.find(platform::currentThreadId());
    QrProcessControl* const controller = found ? *found : nullptr;
    if (CachedController::set(reinterpret_cast<std::uintptr_t>(controller)))
        CachedGeneration::set(generation.load(std::memory_order_relaxed)); // The lock orders it.
    return controller;
}

QrProcessControl* threadController() {
    if (isCacheCurrent()) [[likely]]
        return cachedController();
    return lookUpThreadController();
}

/// Not inlined: its caller then needs no stack frame for the common path.
[[gnu::noinline]] QrProcessControl* lookUpController() {
    QrProcessControl* controller = lookUpThreadController();
    return controller ? controller : systemController.load(std::memory_order_acquire);
}

} // namespace

} // namespace Mz

using namespace Mz;

QrProcessControl* QrGetProcessController() {
    if (!isCacheCurrent()) [[unlikely]]
        return lookUpController();
    QrProcessControl* controller = cachedController();
    return controller ? controller : systemController.load(std::memory_order_acquire);
}

QrProcessControl* QrGetSystemProcessController() {
    return systemController.load(std::memory_order_acquire);
}

void QrSetSystemProcessController(QrProcessControl* controller) {
    systemController.store(controller, std::memory_order_release);
}

QrProcessControl* QrGetThreadProcessController() {
    return threadController();
}

void QrSetThreadProcessController(QrProcessControl* controller) {
    ThreadControllers& controllers = registry.value;
    const std::lock_guard lock(controllers.spinLock);
    const std::uint32_t thread = platform::currentThreadId();
    if (controller)
        controllers.byThread[thread] = controller;
    else
        controllers.byThread.erase(thread);
    generation.fetch_add(1, std::memory_order_release);
}

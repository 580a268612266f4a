#include "components/componentManager/processControl.h"

#include "components/componentManager/control/systemController.h"
#include "components/componentManager/control/threadHash.h"
#include "components/componentManager/support/hashMap.h"
#include "components/componentManager/support/noDestructor.h"
#include "components/platform/platform.h"

// Of the system that the build is for.
#include "threadWord.h"

#include <atomic>
#include <cstdint>
#include <mutex>
#include <thread>

namespace Mz {

namespace {

/// A lock that needs no constructor to run, which a mutex does on one of the platforms. It is held
/// for a look-up only, never while foreign code runs.
class Lock {
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
    Lock mutex;
    HashMap<std::uint32_t, QrProcessControl*, ThreadHash> byThread;
};

constinit NoDestructor<ThreadControllers> threads;

/// Counts the changes to `threads`, so that a thread knows whether what it remembers still holds.
constinit std::atomic<std::uintptr_t> generation{1};

/// What a thread found when it last looked, and the generation of that. A later thread with the
/// same identifier finds what its predecessor left, as any look-up would.
using RememberedGeneration = platform::ThreadWord<struct GenerationName>;
using RememberedController = platform::ThreadWord<struct ControllerName>;

QrProcessControl* rememberedController() {
    return reinterpret_cast<QrProcessControl*>(RememberedController::get());
}

bool isRememberedCurrent() {
    return RememberedGeneration::get() == generation.load(std::memory_order_acquire);
}

/// In the copy of a process nobody may find the lock taken by a thread that is not there, nor what
/// was remembered for the identifier that the thread had before.
struct ForkWatch {
    ForkWatch() {
        platform::aroundForks([] { threads.value.mutex.lock(); },
                              [] { threads.value.mutex.unlock(); },
                              [] {
                                  generation.fetch_add(1, std::memory_order_release);
                                  threads.value.mutex.unlock();
                              });
    }
} const forkWatch;

void clearRegistry() {
    const std::lock_guard lock(threads.value.mutex);
    threads.value.byThread.clear();
    generation.fetch_add(1, std::memory_order_release);
    RememberedController::release();
    RememberedGeneration::release();
}
MZ_AT_UNLOAD(clearRegistry);

QrProcessControl* lookUp() {
    ThreadControllers& controllers = threads.value;
    const std::lock_guard lock(controllers.mutex);
    QrProcessControl* const* found = controllers.byThread.find(platform::currentThreadId());
    QrProcessControl* const controller = found ? *found : nullptr;
    if (RememberedController::set(reinterpret_cast<std::uintptr_t>(controller)))
        RememberedGeneration::set(generation.load(std::memory_order_relaxed));
    return controller;
}

QrProcessControl* threadController() {
    if (isRememberedCurrent()) [[likely]]
        return rememberedController();
    return lookUp();
}

/// Apart from its caller, which then needs no frame.
[[gnu::noinline]] QrProcessControl* lookUpAny() {
    QrProcessControl* controller = lookUp();
    return controller ? controller : systemController.load(std::memory_order_acquire);
}

} // namespace

} // namespace Mz

using namespace Mz;

QrProcessControl* QrGetProcessController() {
    if (!isRememberedCurrent()) [[unlikely]]
        return lookUpAny();
    QrProcessControl* controller = rememberedController();
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
    ThreadControllers& controllers = threads.value;
    const std::lock_guard lock(controllers.mutex);
    const std::uint32_t thread = platform::currentThreadId();
    if (controller)
        controllers.byThread[thread] = controller;
    else
        controllers.byThread.erase(thread);
    generation.fetch_add(1, std::memory_order_release);
}

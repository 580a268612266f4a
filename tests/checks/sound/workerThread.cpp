// SPDX-License-Identifier: BSL-1.0
/// Each object has a worker thread, which ends with the object.
#include "tests/checks/sound/thing.h"

#include <condition_variable>
#include <mutex>
#include <system_error>
#include <thread>

using namespace Mz;
using namespace Mz::Test;

namespace {

class Worker final : public Kit::Object<Worker, Thing> {
  public:
    Worker() : thread([this] { work(); }) {}
    ~Worker() override {
        {
            const std::lock_guard lock(mutex);
            ending = true;
        }
        changed.notify_all();
        thread.join();
    }
    int value() const override { return 6; }

  private:
    void work() {
        std::unique_lock lock(mutex);
        changed.wait(lock, [this] { return ending; });
    }

    std::mutex mutex;
    std::condition_variable changed;
    bool ending = false;
    std::thread thread; // last: it uses the others
};

/// Hosts do not expect the exception of a thread that cannot be started.
class WorkerBuilder final : public Kit::Builder<WorkerBuilder> {
  public:
    static constexpr QrUid builderUid = soundUid(6);

    WorkerBuilder() : Builder({.uid = builderUid, .name = L"worker"}) {}
    QrRef<QrCastable> createObject() override {
        try {
            return (new Worker)->getCastable();
        } catch (const std::system_error&) {
            return nullptr;
        }
    }
};

} // namespace

MZ_COMPONENT(L"Worker", L"Works in a thread", Kit::builder<WorkerBuilder>())

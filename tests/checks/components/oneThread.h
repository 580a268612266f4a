// SPDX-License-Identifier: BSL-1.0
/// What a builder has that only one thread may use.
#pragma once

#include <atomic>
#include <chrono>
#include <thread>

namespace Mz::Test {

/// Notices when several threads are in a function at a time.
class OneThread {
  public:
    /// Call it in the function. Returns whether no other thread is there. Until two threads have
    /// met, a thread other than the one that made this object waits for another one, for a second
    /// at most and once: calls as short as these may never meet by chance.
    bool isAlone() {
        const bool alone = users++ == 0;
        if (!alone)
            met = true;
        else if (std::this_thread::get_id() != maker && !waited.exchange(true))
            waitForOther();
        --users;
        return alone;
    }

  private:
    void waitForOther() const {
        const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(1);
        while (!met && std::chrono::steady_clock::now() < end)
            std::this_thread::yield();
    }

    const std::thread::id maker = std::this_thread::get_id();
    std::atomic<int> users{0};
    std::atomic<bool> met{false};
    std::atomic<bool> waited{false};
};

} // namespace Mz::Test

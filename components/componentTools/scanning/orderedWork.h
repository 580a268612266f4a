// SPDX-License-Identifier: BSL-1.0
/// Does the parts of a work on several threads, and hands them over in their order.
#pragma once

#include <atomic>
#include <condition_variable>
#include <cstddef>
#include <exception>
#include <functional>
#include <mutex>
#include <thread>
#include <vector>

namespace Mz::Tools {

/// Does `count` parts, each once, on its own threads. With fewer than two threads it has none, and
/// does each part in `wait`. Parts begin in their order, and end in any.
class OrderedWork {
  public:
    /// Does the part with this index. Several threads may call it at once.
    using Part = std::function<void(std::size_t index, const OrderedWork& work)>;

    /// Begins with the first parts. If the system has fewer threads left than `threads`, it uses
    /// those that it gets.
    OrderedWork(std::size_t count, std::size_t threads, Part part);
    /// Stops, and waits for the parts that have begun. Those that have not are left out.
    ~OrderedWork();
    OrderedWork(const OrderedWork&) = delete;
    OrderedWork& operator=(const OrderedWork&) = delete;

    /// Waits for the end of a part; the caller waits for each, in their order.
    /// \param poll  called about a hundred times a second meanwhile, unless there are no threads
    /// \throws whatever the part or `poll` throws
    void wait(std::size_t index, const std::function<void()>& poll);

    /// Tells the parts to end soon. They still begin.
    void stop() { stopped = true; }
    bool isStopped() const { return stopped; }

    /// Returns whether the parts run on other threads than that of the caller.
    bool hasThreads() const { return threaded; }

  private:
    struct End {
        bool done = false;
        std::exception_ptr failure;
    };

    void run();

    const Part part;
    std::vector<End> ends;
    std::mutex mutex; ///< guards `ends`
    std::condition_variable changed;
    std::atomic<std::size_t> next{0};
    std::atomic<bool> stopped{false}, abandoned{false};
    bool threaded = false; ///< constant while there are threads
    std::vector<std::thread> threads;
};

} // namespace Mz::Tools

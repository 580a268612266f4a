// SPDX-License-Identifier: BSL-1.0
/// Each thread takes the next part until there is none. The threads block all signals: handlers of
/// the host run in the host's own threads.
#include "components/componentTools/scanning/orderedWork.h"

#include "components/componentTools/platform/system.h"

#include <algorithm>
#include <chrono>
#include <system_error>
#include <utility>

namespace Mz::Tools {

OrderedWork::OrderedWork(std::size_t count, std::size_t wanted, Part onePart)
    : part(std::move(onePart)), ends(count) {
    wanted = std::min(wanted, count);
    if (wanted < 2)
        return;
    const System::BlockedSignals blocked; // New threads inherit this.
    threads.reserve(wanted);
    threaded = true;
    try {
        while (threads.size() < wanted)
            threads.emplace_back([this] { run(); });
    } catch (const std::system_error&) { // The system has no more threads.
        threaded = !threads.empty();
    }
}

OrderedWork::~OrderedWork() {
    stopped = abandoned = true;
    for (std::thread& thread : threads)
        thread.join();
}

void OrderedWork::wait(std::size_t index, const std::function<void()>& poll) {
    if (!hasThreads())
        return part(index, *this);
    using Clock = std::chrono::steady_clock;
    constexpr std::chrono::milliseconds interval(10);
    std::unique_lock lock(mutex);
    // The ends of other parts wake this thread, too, and must not delay the poll.
    for (auto nextPoll = Clock::now() + interval; !ends[index].done;) {
        if (changed.wait_until(lock, nextPoll) == std::cv_status::no_timeout &&
            Clock::now() < nextPoll)
            continue;
        lock.unlock();
        poll();
        lock.lock();
        nextPoll = Clock::now() + interval;
    }
    if (ends[index].failure)
        std::rethrow_exception(ends[index].failure);
}

void OrderedWork::run() {
    for (std::size_t index = next++; index < ends.size() && !abandoned; index = next++) {
        std::exception_ptr failure;
        try {
            part(index, *this);
        } catch (...) {
            failure = std::current_exception();
        }
        const std::lock_guard lock(mutex);
        ends[index] = {true, std::move(failure)};
        changed.notify_all();
    }
}

} // namespace Mz::Tools

// SPDX-License-Identifier: BSL-1.0
/// A word of memory in each thread. The build selects this file or the one of the same name in
/// `posix/`.
///
/// `thread_local` of this compiler is not used: its memory stays allocated in each thread after the
/// library is unloaded, so each cycle of loading and unloading would leak.
#pragma once

#include <atomic>
#include <cstdint>

namespace Mz::platform {

/// An index of thread-local storage, which is allocated by the first `set`.
class ThreadSlot {
  public:
    /// Returns the value of the calling thread; 0 if it was never set.
    std::uintptr_t get() const;
    /// Sets the value of the calling thread. Returns false if the system has no index or no memory
    /// left, and after `release`.
    bool set(std::uintptr_t value);
    /// Frees the index. All values are 0 afterwards.
    void release();

  private:
    /// The system's index plus one; 0 before the first `set`, `released` after `release`.
    std::atomic<std::uint32_t> index{0};
    static constexpr std::uint32_t released = 0xFFFFFFFF;
};

/// The thread-local word of the tag type `Name`, which is 0 in a new thread.
template <class Name>
class ThreadWord {
  public:
    /// Returns the word of the calling thread.
    static std::uintptr_t get() { return slot.get(); }
    /// Sets the word of the calling thread. Returns false if there is no memory for it; then it is
    /// 0.
    static bool set(std::uintptr_t value) { return slot.set(value); }
    /// Frees the words of all threads. Call it when the library is unloaded.
    static void release() { slot.release(); }

  private:
    static constinit inline ThreadSlot slot;
};

} // namespace Mz::platform

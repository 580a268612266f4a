// SPDX-License-Identifier: BSL-1.0
/// A word of memory in each thread. The build selects this file or the one of the same name in
/// `windows/`.
#pragma once

#include <cstdint>

namespace Mz::platform {

/// The thread-local word of the tag type `Name`, which is 0 in a new thread. Here it is a
/// `thread_local` variable. A source that is compiled for the initial-exec model accesses it
/// without a call.
template <class Name>
class ThreadWord {
  public:
    /// Returns the word of the calling thread.
    static std::uintptr_t get() { return word; }
    /// Sets the word of the calling thread. Returns false if there is no memory for it; then it is
    /// 0.
    static bool set(std::uintptr_t value) {
        word = value;
        return true;
    }
    /// Frees the words of all threads. Call it when the library is unloaded.
    static void release() {}

  private:
    static constinit inline thread_local std::uintptr_t word = 0;
};

} // namespace Mz::platform

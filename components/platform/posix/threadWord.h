/// A word of memory for each thread. The build chooses between this file and the one of the same
/// name in `windows/`.
#pragma once

#include <cstdint>

namespace Mz::platform {

/// The word called `Name`, which is 0 in a new thread. Here it lies in the thread's own memory, at
/// a distance that the loader knows, so that reading it takes no call.
template <class Name>
class ThreadWord {
  public:
    static std::uintptr_t get() { return word; }
    /// Returns false when there is no memory for it; it is 0 then.
    static bool set(std::uintptr_t value) {
        word = value;
        return true;
    }
    /// Gives back what the words of all threads take. To be called when the library is unloaded.
    static void release() {}

  private:
    static constinit inline thread_local std::uintptr_t word = 0;
};

} // namespace Mz::platform

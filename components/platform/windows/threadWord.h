/// A word of memory for each thread. The build chooses between this file and the one of the same
/// name in `posix/`.
///
/// The compiler's `thread_local` is no choice here: its memory stays with the thread when the
/// library is unloaded, so it would grow with each cycle of loading and unloading.
#pragma once

#include <atomic>
#include <cstdint>

namespace Mz::platform {

/// A place in the memory that the system keeps for each thread, taken at the first `set`.
class ThreadPlace {
  public:
    std::uintptr_t get() const;
    bool set(std::uintptr_t value);
    void release();

  private:
    /// The system's index plus one; 0 before the first `set`, and `released` in the end.
    std::atomic<std::uint32_t> place{0};
    static constexpr std::uint32_t released = 0xFFFFFFFF;
};

/// The word called `Name`, which is 0 in a new thread.
template <class Name>
class ThreadWord {
  public:
    static std::uintptr_t get() { return place.get(); }
    /// Returns false when there is no memory for it; it is 0 then.
    static bool set(std::uintptr_t value) { return place.set(value); }
    /// Gives back what the words of all threads take. To be called when the library is unloaded.
    static void release() { place.release(); }

  private:
    static constinit inline ThreadPlace place;
};

} // namespace Mz::platform

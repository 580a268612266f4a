/// The counter under every counted reference.
#pragma once

#include <atomic>
#include <cstdint>

namespace Mz {

/// An atomic signed counter of 32 bits on every platform, whatever the width of `T`; it wraps
/// round at the ends of that range. `T` (`long` throughout the library) is only the type in which
/// values enter and leave.
///
/// May be incremented and decremented from any number of threads. Decrements are ordered so that
/// whoever brings the counter to its last value sees everything that the others did before.
template <class T>
class LkCounterWindows {
  public:
    explicit constexpr LkCounterWindows(T initial) noexcept
        : count(static_cast<std::int32_t>(initial)) {}
    ~LkCounterWindows() = default;
    LkCounterWindows(const LkCounterWindows&) = delete;
    LkCounterWindows& operator=(const LkCounterWindows&) = delete;

    /// Adds one and returns the new value.
    T operator++() noexcept { return wrapped(count.fetch_add(1, std::memory_order_relaxed), 1); }

    /// Takes one away and returns the new value.
    T operator--() noexcept { return wrapped(count.fetch_sub(1, std::memory_order_acq_rel), -1); }

    /// The value at this moment, which other threads may be changing.
    T value() const noexcept { return static_cast<T>(count.load(std::memory_order_relaxed)); }

  private:
    static T wrapped(std::int32_t before, int step) noexcept {
        const auto sum = static_cast<std::uint32_t>(before) + static_cast<std::uint32_t>(step);
        return static_cast<T>(static_cast<std::int32_t>(sum));
    }

    std::atomic<std::int32_t> count;
};

} // namespace Mz

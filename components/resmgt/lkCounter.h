// SPDX-License-Identifier: BSL-1.0
/// The atomic counter of counted objects.
#pragma once

#include <atomic>
#include <cstdint>

namespace Mz {

/// An atomic signed 32-bit counter.
///
/// `T` is the type of parameters and results only (`long` throughout the library). The counter has
/// 32 bits on every platform, whatever the width of `T`, and wraps around on overflow.
///
/// Thread-safe. Decrements have acquire-release order: the thread whose decrement reaches the final
/// value sees all writes that other threads made before their decrements.
template <class T>
class LkCounterWindows {
  public:
    /// Starts at `initial`, truncated to 32 bits.
    explicit constexpr LkCounterWindows(T initial) noexcept
        : count(static_cast<std::int32_t>(initial)) {}
    ~LkCounterWindows() = default;
    LkCounterWindows(const LkCounterWindows&) = delete;
    LkCounterWindows& operator=(const LkCounterWindows&) = delete;

    /// Adds one and returns the new value.
    T operator++() noexcept {
        return wrappingSum(count.fetch_add(1, std::memory_order_relaxed), 1);
    }

    /// Subtracts one and returns the new value.
    T operator--() noexcept {
        return wrappingSum(count.fetch_sub(1, std::memory_order_acq_rel), -1);
    }

    /// Makes the value -1 and returns true if it is 0; else changes nothing and returns false.
    ///
    /// Only for a value that no other thread can change while it is 0: it costs no atomic
    /// subtraction, which takes most of the time of the decrement. Acquires what other threads
    /// released by their decrements, as the decrement does.
    bool dropLast() noexcept {
        if (count.load(std::memory_order_acquire) != 0)
            return false;
        count.store(-1, std::memory_order_relaxed);
        return true;
    }

    /// Returns the current value. Other threads may change it at any time.
    T value() const noexcept { return static_cast<T>(count.load(std::memory_order_relaxed)); }

  private:
    /// Repeats the step of the atomic operation, which returned the value before it. Unsigned
    /// arithmetic wraps around where signed arithmetic would be undefined.
    static T wrappingSum(std::int32_t before, int step) noexcept {
        const auto sum = static_cast<std::uint32_t>(before) + static_cast<std::uint32_t>(step);
        return static_cast<T>(static_cast<std::int32_t>(sum));
    }

    std::atomic<std::int32_t> count;
};

} // namespace Mz

// SPDX-License-Identifier: BSL-1.0
/// Repeats operations that take a few nanoseconds.
#pragma once

#include <benchmark/benchmark.h>

namespace Mz::Benchmarks {

/// Returns `pointer` but hides its origin from the compiler, so that no call through it is resolved
/// at compile time or merged with the one before. Costs no instruction.
template <class T>
T* opaque(T* pointer) {
    asm volatile("" : "+r"(pointer));
    return pointer;
}

/// Measures `operation` with almost no cost of the loop.
template <class Operation>
void repeat(benchmark::State& state, Operation operation) {
    constexpr int batch = 64;
    while (state.KeepRunningBatch(batch)) {
        for (int count = 0; count < batch; ++count)
            operation();
    }
}

} // namespace Mz::Benchmarks

// SPDX-License-Identifier: BSL-1.0
/// How an operation of a few nanoseconds is repeated.
#pragma once

#include <benchmark/benchmark.h>

namespace Mz::Benchmarks {

/// `pointer`, but the compiler no longer knows where it came from or what it points to, so that no
/// call through it is resolved or merged with the one before. Costs no instruction.
template <class T>
T* opaque(T* pointer) {
    asm volatile("" : "+r"(pointer));
    return pointer;
}

/// Measures `operation`, with next to nothing of the loop around it.
template <class Operation>
void repeat(benchmark::State& state, Operation operation) {
    constexpr int batch = 64;
    while (state.KeepRunningBatch(batch)) {
        for (int count = 0; count < batch; ++count)
            operation();
    }
}

} // namespace Mz::Benchmarks

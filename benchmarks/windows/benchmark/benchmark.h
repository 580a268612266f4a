// SPDX-License-Identifier: BSL-1.0
/// The part of Google Benchmark's interface that the benchmarks use, with a measuring loop of this
/// project. Debian has no Google Benchmark for MinGW.
///
/// Measures the time that passes, in place of the processor's: see `measuredTime`.
#pragma once

#include "processMeasures.h"

#include <cstdint>
#include <deque>
#include <functional>
#include <string>
#include <utility>

namespace benchmark {

enum TimeUnit { kMillisecond };

/// One run of a benchmark: counts its iterations and measures them.
class State {
  public:
    /// Runs the loop of the body at least `iterations` times.
    explicit State(std::int64_t iterations) : wanted(iterations) {}

    /// Returns whether to run `count` more iterations.
    bool KeepRunningBatch(std::int64_t count) {
        if (done < wanted && error.empty()) {
            if (done == 0)
                started = Mz::Benchmarks::measuredTime();
            done += count;
            return true;
        }
        elapsed = Mz::Benchmarks::measuredTime() - started;
        return false;
    }

    /// Sets the time of an iteration that measures itself.
    void SetIterationTime(double seconds) { ownTime += seconds; }

    /// Ends the loop. The benchmark counts as failed.
    void SkipWithError(const char* message) { error = message; }

    /// Iterates in a loop over the state.
    class Iterator {
      public:
        explicit Iterator(State* state) : state(state) {}
        bool operator!=(const Iterator&) const { return state->KeepRunningBatch(1); }
        Iterator& operator++() { return *this; }
        int operator*() const { return 0; }

      private:
        State* state;
    };
    Iterator begin() { return Iterator(this); }
    Iterator end() { return Iterator(this); }

    /// Returns the seconds of all iterations.
    double seconds(bool setByBody) const { return setByBody ? ownTime : elapsed; }
    std::int64_t iterations() const { return done; }
    const std::string& errorMessage() const { return error; }

  private:
    std::int64_t wanted;
    std::int64_t done = 0;
    double started = 0;
    double elapsed = 0;
    double ownTime = 0;
    std::string error;
};

/// A benchmark by name.
class Benchmark {
  public:
    Benchmark(std::string name, std::function<void(State&)> body)
        : ownName(std::move(name)), ownBody(std::move(body)) {}

    Benchmark* UseManualTime() {
        timedByBody = true;
        return this;
    }
    Benchmark* Iterations(std::int64_t count) {
        fixedIterations = count;
        return this;
    }
    /// The table chooses the units.
    Benchmark* Unit(TimeUnit) { return this; }

    const std::string& name() const { return ownName; }
    const std::function<void(State&)>& body() const { return ownBody; }
    bool usesManualTime() const { return timedByBody; }
    /// Returns the number of iterations, or 0 if it depends on the time that they take.
    std::int64_t iterations() const { return fixedIterations; }

  private:
    std::string ownName;
    std::function<void(State&)> ownBody;
    bool timedByBody = false;
    std::int64_t fixedIterations = 0;
};

/// Returns all benchmarks, in the order in which they were registered.
inline std::deque<Benchmark>& registeredBenchmarks() {
    static std::deque<Benchmark> all;
    return all;
}

inline Benchmark* RegisterBenchmark(const char* name, std::function<void(State&)> body) {
    return &registeredBenchmarks().emplace_back(name, std::move(body));
}

/// Lets the compiler assume that `value` is read and changed here.
template <class T>
void DoNotOptimize(T& value) {
    asm volatile("" : "+m"(value) : : "memory");
}

} // namespace benchmark

// SPDX-License-Identifier: BSL-1.0
// A failure of a process is one of the benchmark.
#include "freshStart.h"

#include <exception>

namespace Mz::Benchmarks {

RatioTable::Body freshly(const std::string& work, const SharedFolder& folder, long expected,
                         const std::string& program) {
    return [=](benchmark::State& state) {
        for (auto iteration : state) {
            static_cast<void>(iteration);
            try {
                const FreshResult result = program.empty()
                                               ? inFreshProcess(work, folder->path())
                                               : inFreshProcess(work, folder->path(), program);
                state.SetIterationTime(result.seconds);
                if (result.count != expected)
                    state.SkipWithError((work + " found " + std::to_string(result.count) + " of " +
                                         std::to_string(expected))
                                            .c_str());
            } catch (const std::exception& failure) {
                state.SkipWithError(failure.what());
            }
        }
    };
}

} // namespace Mz::Benchmarks

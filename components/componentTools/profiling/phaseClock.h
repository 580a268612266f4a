// SPDX-License-Identifier: BSL-1.0
/// A clock that assigns the time of one candidate to phases.
#pragma once

#include "components/componentTools/profile.h"

#include <chrono>
#include <cstddef>
#include <optional>

namespace Mz::Tools {

/// Measures one candidate. At each moment at most one phase runs. Messages to the parent process
/// are sent while none does.
class PhaseClock {
  public:
    /// Ends the current phase and continues with another one.
    void enter(StartPhase next) {
        const Clock::time_point now = Clock::now();
        stopAt(now);
        phase = next;
        begin = now;
    }

    /// Ends the current phase.
    void pause() { stopAt(Clock::now()); }

    const PhaseTimes& times() const { return elapsed; }

  private:
    using Clock = std::chrono::steady_clock;

    void stopAt(Clock::time_point now) {
        if (phase)
            elapsed[static_cast<std::size_t>(*phase)] += now - begin;
        phase.reset();
    }

    PhaseTimes elapsed{};
    std::optional<StartPhase> phase;
    Clock::time_point begin;
};

} // namespace Mz::Tools

// SPDX-License-Identifier: BSL-1.0
/// Signals that interrupt this process all the time, on POSIX systems.
#pragma once

#include <csignal>
#include <sys/time.h>

namespace Mz::Test {

/// While it lives, a signal arrives every millisecond. Its handler does nothing, and system calls
/// that it interrupts fail instead of going on.
class SignalStorm {
  public:
    SignalStorm() {
        arrived = 0;
        struct sigaction action {};
        action.sa_handler = [](int) { arrived = arrived + 1; };
        ::sigaction(SIGALRM, &action, &previous);
        setInterval(1000);
    }
    ~SignalStorm() {
        setInterval(0);
        ::sigaction(SIGALRM, &previous, nullptr);
    }
    SignalStorm(const SignalStorm&) = delete;
    SignalStorm& operator=(const SignalStorm&) = delete;

    /// Returns how many signals have arrived.
    static int count() { return arrived; }

  private:
    static void setInterval(suseconds_t microseconds) {
        const itimerval interval{{0, microseconds}, {0, microseconds}};
        ::setitimer(ITIMER_REAL, &interval, nullptr);
    }

    static inline volatile std::sig_atomic_t arrived = 0;
    struct sigaction previous {};
};

/// Calls `work` under a storm until `signals` signals have arrived.
template <class Work>
void underSignals(int signals, Work&& work) {
    const SignalStorm storm;
    while (SignalStorm::count() < signals)
        work();
}

} // namespace Mz::Test

// SPDX-License-Identifier: BSL-1.0
/// Makes allocations fail on request.
///
/// On Linux the program's operator new also serves the libraries. On Windows a DLL imports that of
/// the C++ library by the name of its file, so only the allocations of the program fail, which
/// include those of header-only code.
#pragma once

#include <gtest/gtest.h>

#include <new>

namespace Mz::Test {

/// While it lives, allocations of the thread that constructed it fail.
class FailingAllocations {
  public:
    /// Which allocations fail after those that succeed.
    enum class Which { one, all };

    /// \param allowed  how many allocations succeed first
    explicit FailingAllocations(int allowed, Which which = Which::all);
    ~FailingAllocations();
    FailingAllocations(const FailingAllocations&) = delete;
    FailingAllocations& operator=(const FailingAllocations&) = delete;

    /// Returns whether an allocation has failed.
    bool failed() const;
};

/// One run of an operation, in which an allocation may fail.
class Attempt {
  public:
    Attempt(int allowedAllocations, FailingAllocations::Which whichFail)
        : allowed(allowedAllocations), which(whichFail) {}

    /// Calls `operation`. Returns false if it threw `std::bad_alloc`. Other exceptions propagate.
    template <class Operation>
    bool run(Operation&& operation) {
        const FailingAllocations failing(allowed, which);
        try {
            operation();
            failed = failing.failed();
            return true;
        } catch (const std::bad_alloc&) {
            failed = failing.failed();
            return false;
        }
    }

    /// Calls `operation`. Returns whether it threw if an allocation failed, and only then.
    template <class Operation>
    bool throwsOnFailure(Operation&& operation) {
        return run(operation) != failed;
    }

    /// Whether an allocation failed in `run`.
    bool failed = false;

  private:
    int allowed;
    FailingAllocations::Which which;
};

/// Calls `test(attempt)` with the first allocation failing, then the second one, and so on, until
/// none fails: once with a single failure, and once with all later allocations failing too. The
/// test must call `attempt.run`. Returns the number of attempts in which an allocation failed.
template <class Test>
int failEachAllocation(Test&& test) {
    constexpr int mostAllocations = 20000;
    int failures = 0;
    for (const auto which : {FailingAllocations::Which::one, FailingAllocations::Which::all})
        for (int allowed = 0; allowed < mostAllocations; ++allowed) {
            SCOPED_TRACE(which == FailingAllocations::Which::one ? "one fails" : "all fail");
            SCOPED_TRACE(allowed);
            Attempt attempt(allowed, which);
            test(attempt);
            if (testing::Test::HasFatalFailure() || !attempt.failed)
                break;
            ++failures;
        }
    return failures;
}

/// Returns the least number of failures to expect of an operation that allocates `count` times,
/// most of them in the libraries.
int leastFailures(int count);

} // namespace Mz::Test

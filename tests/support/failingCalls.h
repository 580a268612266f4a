// SPDX-License-Identifier: BSL-1.0
/// Makes functions of the C library fail that the libraries call: those that open, read, write,
/// list, rename and describe files, and those that start and watch processes. Linux only.
///
/// The program defines these functions, and its definitions take precedence over those of the C
/// library. Calls inside the C library, and those of the loader, are not affected.
#pragma once

#include <gtest/gtest.h>

#include <string>

namespace Mz::Test {

/// While it lives, one call of the thread that constructed it fails.
class FailingCall {
  public:
    /// \param allowed  how many calls succeed first
    /// \param error  the error number of the call that fails
    FailingCall(int allowed, int error);
    ~FailingCall();
    FailingCall(const FailingCall&) = delete;
    FailingCall& operator=(const FailingCall&) = delete;

    /// Returns the name of the function that failed; empty if none has.
    std::string failed() const;
};

/// While it lives, each read and write of the thread that constructed it transfers one byte only.
class ShortTransfers {
  public:
    ShortTransfers();
    ~ShortTransfers();
    ShortTransfers(const ShortTransfers&) = delete;
    ShortTransfers& operator=(const ShortTransfers&) = delete;
};

/// Returns the number of open descriptors of this process.
int openDescriptors();

/// One run of an operation, in which a call may fail.
class CallAttempt {
  public:
    CallAttempt(int allowedCalls, int errorNumber) : allowed(allowedCalls), error(errorNumber) {}

    /// Calls `operation` and returns its result.
    template <class Operation>
    auto run(Operation&& operation) {
        struct Note {
            FailingCall failing;
            std::string& name;
            ~Note() { name = failing.failed(); }
        } const note{{allowed, error}, failed};
        return operation();
    }

    /// The name of the function that failed in `run`; empty if none has.
    std::string failed;

  private:
    int allowed;
    int error;
};

/// Calls `test(attempt)` with the first call failing with `error`, then the second one, and so on,
/// until none fails. The test must call `attempt.run`. Returns the number of attempts in which a
/// call failed. Expects that none leaves a descriptor open.
template <class Test>
int failEachCall(int error, Test&& test) {
    constexpr int mostCalls = 5000;
    int failures = 0;
    for (int allowed = 0; allowed < mostCalls; ++allowed) {
        SCOPED_TRACE(error);
        SCOPED_TRACE(allowed);
        const int before = openDescriptors();
        CallAttempt attempt(allowed, error);
        test(attempt);
        EXPECT_EQ(openDescriptors(), before) << attempt.failed;
        if (testing::Test::HasFatalFailure() || attempt.failed.empty())
            break;
        ++failures;
    }
    return failures;
}

} // namespace Mz::Test

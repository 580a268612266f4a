// SPDX-License-Identifier: BSL-1.0
// Tests exceptions without memory. On POSIX, the program's operator new also serves the libraries.
#include "components/base/assertions.h"
#include "components/componentManager/exceptions.h"
#include "tests/support/failingAllocations.h"

#include <gtest/gtest.h>

#include <memory>
#include <new>
#include <string>

using namespace Mz;
using Mz::Test::FailingAllocations;

namespace {

TEST(ExceptionConstruction, LetsAFailedAllocationThrough) {
    const std::string name(1000, 'n');
    int failures = 0;
    for (int allowed = 0;; ++allowed) {
        ASSERT_LT(allowed, 100);
        try {
            const FailingAllocations failing(allowed);
            const QrStreamEx::ExReadError exception("components/some/file", 42, name.c_str());
            break;
        } catch (const std::bad_alloc&) {
            ++failures;
        }
    }
    EXPECT_GE(failures, 2);
}

TEST(ExceptionClone, IsNullWithoutMemory) {
    const std::string name(1000, 'n');
    const QrStreamEx::ExReadError error("components/some/file", 42, name.c_str());
    const QrComponentManagerEx::ExBadCast badCast("components/some/file", 42);
    const Assertions::ExProgramAborted aborted("components/some/file", 42);
    for (const ExBase* const exception :
         {static_cast<const ExBase*>(&error), static_cast<const ExBase*>(&badCast),
          static_cast<const ExBase*>(&aborted)}) {
        int failures = 0;
        std::unique_ptr<ExBase> clone;
        for (int allowed = 0; !clone; ++allowed) {
            ASSERT_LT(allowed, 100);
            const FailingAllocations failing(allowed);
            clone.reset(exception->clone());
            EXPECT_EQ(clone == nullptr, failing.failed());
            failures += clone ? 0 : 1;
        }
        EXPECT_GE(failures, 1);
        EXPECT_STREQ(clone->getReason(), exception->getReason());
    }
}

} // namespace

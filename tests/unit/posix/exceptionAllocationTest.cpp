// SPDX-License-Identifier: BSL-1.0
// Tests exceptions without memory. On POSIX, the program's operator new also serves the libraries.
#include "components/componentManager/exceptions.h"
#include "tests/support/failingAllocations.h"

#include <gtest/gtest.h>

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

} // namespace

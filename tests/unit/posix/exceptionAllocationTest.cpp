// SPDX-License-Identifier: BSL-1.0
// Exceptions without memory, where a program's operator new is that of the libraries too.
#include "components/componentManager/exceptions.h"
#include "tests/unit/allocationFailure.h"

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

// SPDX-License-Identifier: BSL-1.0
/// Component libraries that are slow in one known place.
#pragma once

#include "tests/components/plain.h"
#include "tests/components/testUids.h"

#include <chrono>
#include <thread>

namespace Mz::Test {

/// Takes 200 milliseconds.
inline int sleepLong() {
    std::this_thread::sleep_for(std::chrono::milliseconds(200));
    return 0;
}

} // namespace Mz::Test

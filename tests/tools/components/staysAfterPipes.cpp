// SPDX-License-Identifier: BSL-1.0
/// Closes pipes that it did not open, and lives on for a moment.
#include "tests/support/testSystem.h"
#include "tests/tools/components/enumerates.h"

#include <chrono>
#include <thread>

MZ_TEST_ENUMERATES(Mz::Test::closePipes();
                   std::this_thread::sleep_for(std::chrono::milliseconds(2)))

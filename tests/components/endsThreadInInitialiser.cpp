// SPDX-License-Identifier: BSL-1.0
/// Ends the thread that loads it.
#include "tests/components/testUids.h"

#include <pthread.h>

static const int value = []() -> int { ::pthread_exit(nullptr); }();

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "initialiser",
                     {{Mz::Test::faultyUid, L"faulty", L"", L"", static_cast<unsigned int>(value)}})

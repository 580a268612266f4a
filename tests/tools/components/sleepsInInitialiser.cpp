// SPDX-License-Identifier: BSL-1.0
// Is slow in the initialiser of a static object.
#include "tests/tools/components/sleeps.h"

static const int value = Mz::Test::sleepLong();

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "sleeps",
                     {{Mz::Test::testUid(0x41001), L"sleeps", L"", L"",
                       static_cast<unsigned int>(value)}})

// SPDX-License-Identifier: BSL-1.0
// Crashes in the initialiser of a static object.
#include "tests/components/testUids.h"
#include "tests/tools/components/faults.h"

static const int value = Mz::Test::crash();

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "crashes",
                     {{Mz::Test::faultyUid, L"faulty", L"", L"", static_cast<unsigned int>(value)}})

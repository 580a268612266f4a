// SPDX-License-Identifier: BSL-1.0
// Needs a library that the loader does not find.
#include "tests/components/testUids.h"

extern "C" MZ_IMPORT int absentFunction();

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "misses",
                     {{Mz::Test::faultyUid, L"faulty", L"", L"",
                       static_cast<unsigned int>(absentFunction())}})

// SPDX-License-Identifier: BSL-1.0
// Needs a library that only its own manifest lets the loader find.
#include "tests/components/testUids.h"

extern "C" MZ_IMPORT unsigned int sideBySideNumber();

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "manifest",
                     {{Mz::Test::manifestUid, L"manifest", L"", L"", sideBySideNumber()}})

// SPDX-License-Identifier: BSL-1.0
#include "tests/components/testUids.h"

extern "C" MZ_IMPORT unsigned int sideBySideNumber();

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "manifest",
                     {{Mz::Test::manifestUid, L"manifest", L"", L"", sideBySideNumber()}})

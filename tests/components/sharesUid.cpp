// SPDX-License-Identifier: BSL-1.0
/// One of two libraries that have a builder with the same uid. MZ_TEST_SHARER is its number.
#include "tests/components/testUids.h"

using namespace Mz::Test;

MZ_PLAIN_ENTRY_POINT(PlainDescription, MZ_TEST_SHARER == 1 ? "first" : "second",
                     {{sharedUid, MZ_TEST_SHARER == 1 ? L"first" : L"second"},
                      {MZ_TEST_SHARER == 1 ? firstSharerUid : secondSharerUid, L"own"}})

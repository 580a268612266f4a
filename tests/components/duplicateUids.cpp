// SPDX-License-Identifier: BSL-1.0
/// Two builders with one identifier.
#include "tests/components/testUids.h"

using namespace Mz::Test;

MZ_PLAIN_ENTRY_POINT(PlainDescription, "duplicate",
                     {{duplicateUid, L"first"}, {duplicateUid, L"second"}})

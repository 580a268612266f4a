// SPDX-License-Identifier: BSL-1.0
/// Has two builders with the same uid.
#include "tests/components/testUids.h"

using namespace Mz::Test;

MZ_PLAIN_ENTRY_POINT(PlainDescription, "duplicate",
                     {{duplicateUid, L"first"}, {duplicateUid, L"second"}})

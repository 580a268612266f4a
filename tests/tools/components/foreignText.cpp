// SPDX-License-Identifier: BSL-1.0
/// A builder with a label that few locales can represent.
#include "tests/components/testUids.h"

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "foreign",
                     {{Mz::Test::testUid(0x30002), L"foreign", L"\u4E2D", L""}})

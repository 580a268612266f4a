// SPDX-License-Identifier: BSL-1.0
/// One of many good libraries. Each has a builder with another uid.
#include "tests/components/testUids.h"

extern const unsigned int mzTestNumber;

namespace {

/// Reports that the library was loaded.
struct Presence {
    Presence() { Mz::Test::note("numberedLoaded"); }
} presence;

} // namespace

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "numbered",
                     {{Mz::Test::testUid(0x40000 + mzTestNumber), L"numbered", L"Label", L"Text",
                       mzTestNumber, true}})

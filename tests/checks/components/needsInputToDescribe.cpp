// SPDX-License-Identifier: BSL-1.0
/// Describes itself only if there is standard input.
#include "tests/checks/components/broken.h"

#include "tests/checks/components/system.h"

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    static Mz::Test::PlainDescription description(
        "broken", {{Mz::Test::brokenUid, L"broken", L"Broken", L"One builder"}});
    return Mz::Test::hasStandardInput() ? &description : nullptr;
}

// SPDX-License-Identifier: BSL-1.0
/// Throws when its entry point is called a second time.
#include "tests/checks/components/broken.h"

#include <stdexcept>

extern "C" MZ_EXPORT Mz::QrCastable* QrGetComponentDescription() {
    static int calls = 0;
    if (++calls > 1)
        throw std::runtime_error("one host is enough");
    static Mz::Test::PlainDescription description(
        "broken", {{Mz::Test::brokenUid, L"broken", L"Broken", L"One builder"}});
    return &description;
}

// SPDX-License-Identifier: BSL-1.0
/// Has a label for its builder, and none for itself.
#include "tests/checks/components/broken.h"

MZ_COMPONENT(L"", L"Breaks one rule",
             Mz::Kit::builderOf<Mz::Test::Stored>(
                 {.uid = Mz::Test::brokenUid, .name = L"broken", .label = L"Broken"}))

// SPDX-License-Identifier: BSL-1.0
/// Loads itself, so that it cannot be unloaded.
#include "tests/checks/components/broken.h"

#include "tests/checks/components/system.h"

namespace {

const bool held = Mz::Test::holdThisLibrary();

} // namespace

MZ_BROKEN_DESCRIPTION(Mz::Test::PlainDescription)

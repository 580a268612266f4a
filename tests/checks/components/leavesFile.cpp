// SPDX-License-Identifier: BSL-1.0
/// Opens a file when it is loaded and does not close it.
#include "tests/checks/components/broken.h"

#include "tests/checks/components/system.h"

namespace {

const bool opened = Mz::Test::leaveFileOpen();

} // namespace

MZ_BROKEN_DESCRIPTION(Mz::Test::PlainDescription)

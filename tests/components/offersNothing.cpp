// SPDX-License-Identifier: BSL-1.0
/// A component library without builders.
#include "tests/components/testUids.h"

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "nothing", std::vector<Mz::Test::PlainInfo>())

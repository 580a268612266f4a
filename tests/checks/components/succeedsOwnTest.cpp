// SPDX-License-Identifier: BSL-1.0
/// Brings along a test that succeeds.
#include "tests/checks/components/broken.h"

#include "components/componentKit/componentTest.h"

MZ_BROKEN_OBJECT(Mz::Test::Stored)

MZ_COMPONENT_TESTS({L"right", [](Mz::Kit::TestReport& test) { test.require(true, L"never"); }})

// SPDX-License-Identifier: BSL-1.0
/// Brings along a test that fails, and one that succeeds.
#include "tests/checks/components/broken.h"

#include "components/componentKit/componentTest.h"

MZ_BROKEN_OBJECT(Mz::Test::Stored)

MZ_COMPONENT_TESTS({L"right", [](Mz::Kit::TestReport& test) { test.require(true, L"never"); }},
                   {L"wrong", [](Mz::Kit::TestReport& test) {
                        test.require(1 + 1 == 3, L"one and one is not three");
                    }})

// SPDX-License-Identifier: BSL-1.0
/// Brings along a test that succeeds, one that fails, and one that throws before one that fails.
#include "tests/checks/components/broken.h"

#include "components/componentKit/componentTest.h"

#include <stdexcept>

MZ_BROKEN_OBJECT(Mz::Test::Stored)

MZ_COMPONENT_TESTS(
    {L"right", [](Mz::Kit::TestReport& test) { test.require(true, L"never"); }},
    {L"wrong",
     [](Mz::Kit::TestReport& test) { test.require(1 + 1 == 3, L"one and one is not three"); }},
    {L"throws", [](Mz::Kit::TestReport&) { throw std::runtime_error("no room for one more"); }},
    {L"last", [](Mz::Kit::TestReport& test) { test.fail(L"it is the last one of all"); }})

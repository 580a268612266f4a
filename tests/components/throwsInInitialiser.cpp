// SPDX-License-Identifier: BSL-1.0
// Throws in the initialiser of a static object.
#include "tests/components/testUids.h"

#include <stdexcept>

static const int value = []() -> int { throw std::runtime_error("in an initialiser"); }();

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "initialiser",
                     {{Mz::Test::faultyUid, L"faulty", L"", L"", static_cast<unsigned int>(value)}})

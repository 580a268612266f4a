// SPDX-License-Identifier: BSL-1.0
// Each time it is loaded, adds a character to the file that the environment names.
#include "tests/components/plain.h"
#include "tests/components/testUids.h"

#include <cstdlib>
#include <fstream>

static const bool marked = [] {
    const char* const file = std::getenv("MZ_TEST_LOADS");
    return file && std::ofstream(file, std::ios::app).put('x').good();
}();

MZ_PLAIN_ENTRY_POINT(Mz::Test::PlainDescription, "marks",
                     {{Mz::Test::testUid(0x41004), marked ? L"marked" : L"unmarked", L"", L"", 0}})

// SPDX-License-Identifier: BSL-1.0
// Allocates memory without a useful limit when its builders are enumerated.
#include "tests/tools/components/enumerates.h"

#include <cstring>
#include <list>
#include <string>

static void eat() {
    std::list<std::string> eaten;
    while (eaten.size() < 1'000'000)
        eaten.emplace_back(std::size_t{4} << 20, 'x');
}

MZ_TEST_ENUMERATES(eat())

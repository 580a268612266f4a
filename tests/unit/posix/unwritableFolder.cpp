// SPDX-License-Identifier: BSL-1.0
#include "tests/unit/unwritableFolder.h"

namespace Mz::Test {

std::filesystem::path unwritableFolder() {
    return "/proc/self";
}

} // namespace Mz::Test

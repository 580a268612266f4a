// SPDX-License-Identifier: BSL-1.0
// No process can create files in /proc/self.
#include "tests/unit/unwritableFolder.h"

namespace Mz::Test {

std::filesystem::path unwritableFolder() {
    return "/proc/self";
}

} // namespace Mz::Test

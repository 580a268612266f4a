// SPDX-License-Identifier: BSL-1.0
#include "tests/unit/unwritableFolder.h"

namespace Mz::Test {

std::filesystem::path unwritableFolder() {
    // No file name can contain '?'.
    return L"C:\\a?b";
}

} // namespace Mz::Test

// SPDX-License-Identifier: BSL-1.0
// Compares the file with the targets of the process's descriptors in /proc/self/fd.
#include "tests/unit/openFiles.h"

namespace Mz::Test {

bool isOpen(const std::filesystem::path& file) {
    std::error_code ignored;
    for (const auto& descriptor : std::filesystem::directory_iterator("/proc/self/fd"))
        if (std::filesystem::equivalent(descriptor.path(), file, ignored))
            return true;
    return false;
}

} // namespace Mz::Test

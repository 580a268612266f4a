// SPDX-License-Identifier: BSL-1.0
/// The name is random, and creating a folder fails if the name is taken, so that searches may run
/// concurrently.
#include "components/componentTools/bisecting/temporaryFolder.h"

#include <random>
#include <string>
#include <system_error>

namespace Mz::Tools {

TemporaryFolder::TemporaryFolder() {
    const std::filesystem::path base = std::filesystem::temp_directory_path();
    std::random_device random;
    do {
        folder = base / ("mzcomponents-" + std::to_string(random()));
    } while (!std::filesystem::create_directory(folder));
    std::error_code ignored;
    std::filesystem::permissions(folder, std::filesystem::perms::owner_all, ignored);
}

TemporaryFolder::~TemporaryFolder() {
    std::error_code ignored;
    std::filesystem::remove_all(folder, ignored);
}

} // namespace Mz::Tools

// SPDX-License-Identifier: BSL-1.0
/// Names for the files and folders that the benchmarks make.
#pragma once

#include <filesystem>
#include <random>
#include <string>

namespace Mz::Benchmarks {

/// Returns the path of a file or folder that does not exist, in `folder`. Its name begins with
/// `prefix` and ends with `suffix`.
inline std::filesystem::path
temporaryName(const std::string& prefix, const std::string& suffix = {},
              const std::filesystem::path& folder = std::filesystem::temp_directory_path()) {
    std::random_device random;
    std::filesystem::path name;
    do {
        // Six digits: the recorded lists that are measured have the path of the folder.
        name = folder / (prefix + "-" + std::to_string(100'000 + random() % 900'000) + suffix);
    } while (std::filesystem::exists(name));
    return name;
}

} // namespace Mz::Benchmarks

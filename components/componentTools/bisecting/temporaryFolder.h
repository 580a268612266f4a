// SPDX-License-Identifier: BSL-1.0
/// A temporary folder for the lists of a search.
#pragma once

#include <filesystem>

namespace Mz::Tools {

/// A new, empty folder, which the destructor removes with its content.
class TemporaryFolder {
  public:
    /// \throws std::filesystem::filesystem_error if it cannot be created
    TemporaryFolder();
    ~TemporaryFolder();
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    /// Returns the folder's full path.
    const std::filesystem::path& path() const { return folder; }

  private:
    std::filesystem::path folder;
};

} // namespace Mz::Tools

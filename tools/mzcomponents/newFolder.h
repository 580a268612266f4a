// SPDX-License-Identifier: BSL-1.0
/// A new folder that is written completely or not at all.
#pragma once

#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Commands {

/// Returns why new files cannot be written to the folder, with the name of what is in the way;
/// empty if they can. The folder may be missing or empty. \param folder  a full path
std::wstring obstacleToNew(const std::filesystem::path& folder);

/// Writes files to a new or empty folder, and creates the folders that are missing. Everything that
/// it created is removed again, unless `keep` is called.
class NewFolder {
  public:
    explicit NewFolder(std::filesystem::path folder);
    ~NewFolder();
    NewFolder(const NewFolder&) = delete;
    NewFolder& operator=(const NewFolder&) = delete;

    /// Writes one file.
    /// \param path  relative to the folder; names no existing file
    /// \throws an exception that names the file and the reason
    void write(const std::filesystem::path& path, std::string_view content);

    /// Keeps what was written.
    void keep() { created.clear(); }

    /// Removes what was written. Returns what could not be removed.
    std::vector<std::filesystem::path> remove();

  private:
    void createFolder(const std::filesystem::path& path);

    std::filesystem::path root;
    std::vector<std::filesystem::path> created; ///< in the order of creation
};

} // namespace Mz::Commands

// SPDX-License-Identifier: BSL-1.0
/// Folders full of libraries to search through.
#pragma once

#include <filesystem>

namespace Mz::Benchmarks {

/// A new temporary folder with copies of one library, removed at the end. Each copy is a file of
/// its own; where the library is the generated component, copy number n has the builder
/// `generatedUid(n)`.
class LibraryFolder {
  public:
    /// Throws `std::exception` when the files cannot be made.
    LibraryFolder(const std::filesystem::path& library, unsigned int count);
    ~LibraryFolder();
    LibraryFolder(const LibraryFolder&) = delete;
    LibraryFolder& operator=(const LibraryFolder&) = delete;

    const std::filesystem::path& path() const { return folder; }

  private:
    std::filesystem::path folder;
};

} // namespace Mz::Benchmarks

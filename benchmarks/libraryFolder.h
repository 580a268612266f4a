// SPDX-License-Identifier: BSL-1.0
/// Folders with many copies of a library.
#pragma once

#include <filesystem>

namespace Mz::Benchmarks {

/// A new temporary folder with copies of one library, removed by the destructor. Each copy is a
/// separate file. If the library is the generated component, copy number n has the builder
/// `generatedUid(n)`.
class LibraryFolder {
  public:
    /// Throws `std::exception` if the files cannot be written.
    LibraryFolder(const std::filesystem::path& library, unsigned int count);
    ~LibraryFolder();
    LibraryFolder(const LibraryFolder&) = delete;
    LibraryFolder& operator=(const LibraryFolder&) = delete;

    const std::filesystem::path& path() const { return folder; }

  private:
    std::filesystem::path folder;
};

} // namespace Mz::Benchmarks

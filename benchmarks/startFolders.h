// SPDX-License-Identifier: BSL-1.0
/// The folders of generated libraries on which starts are measured.
#pragma once

#include "libraryFolder.h"

#include <memory>
#include <string>

namespace Mz::Benchmarks {

/// A folder that is made when the first benchmark needs it, and shared with others.
class LazyFolder {
  public:
    /// `preparation` is the work that is done once on the new folder, by `program`.
    LazyFolder(std::string libraryFile, unsigned int libraryCount,
               std::string preparation = "initialize", std::string program = MZ_BENCHMARK_START);

    const std::filesystem::path& path();
    unsigned int size() const { return count; }

  private:
    std::string library;
    unsigned int count;
    std::string firstWork;
    std::string worker;
    std::unique_ptr<LibraryFolder> folder;
};

using SharedFolder = std::shared_ptr<LazyFolder>;

/// Returns the folder of so many component libraries, the same at each call. It contains a recorded
/// list of them, which only works that name it use.
SharedFolder componentFolder(unsigned int count);

/// Returns the folder of 1,000 libraries without the entry point, the same at each call.
SharedFolder bystanderFolder();

} // namespace Mz::Benchmarks

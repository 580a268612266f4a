// SPDX-License-Identifier: BSL-1.0
/// Files that the benchmarks write and read.
#pragma once

#include "temporaryName.h"

#include <filesystem>
#include <fstream>
#include <string>

namespace Mz::Benchmarks {

/// An empty temporary file, removed by the destructor.
class TemporaryFile {
  public:
    /// `suffix` is the end of the name.
    explicit TemporaryFile(const std::string& suffix = {})
        : name(temporaryName("mzBench", suffix).string()) {
        const std::ofstream empty(name);
    }
    ~TemporaryFile() {
        std::error_code ignored;
        std::filesystem::remove(name, ignored);
    }
    TemporaryFile(const TemporaryFile&) = delete;
    TemporaryFile& operator=(const TemporaryFile&) = delete;

    const std::string& path() const { return name; }

  private:
    std::string name;
};

} // namespace Mz::Benchmarks

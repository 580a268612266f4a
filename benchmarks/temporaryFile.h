// SPDX-License-Identifier: BSL-1.0
/// Files that the benchmarks write and read.
#pragma once

#include <filesystem>
#include <stdlib.h>
#include <string>
#include <unistd.h>

namespace Mz::Benchmarks {

/// An empty temporary file, removed by the destructor.
class TemporaryFile {
  public:
    /// `suffix` is the end of the name.
    explicit TemporaryFile(const std::string& suffix = {})
        : name((std::filesystem::temp_directory_path() / "mzBenchXXXXXX").string() + suffix) {
        const int descriptor = ::mkstemps(name.data(), static_cast<int>(suffix.size()));
        if (descriptor >= 0)
            ::close(descriptor);
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

// SPDX-License-Identifier: BSL-1.0
/// A temporary folder for a test.
#pragma once

#include <chrono>
#include <filesystem>
#include <fstream>
#include <string>
#include <string_view>

namespace Mz::Test {

/// A new empty folder, removed with its content by the destructor. Its name is in lower case and
/// its path has neither "." nor "..", as in a search path.
class TemporaryDirectory {
  public:
    TemporaryDirectory() {
        const std::filesystem::path base = std::filesystem::temp_directory_path();
        const auto seed = std::chrono::steady_clock::now().time_since_epoch().count();
        for (long long attempt = seed;; ++attempt) {
            root = (base / ("mz-test-" + std::to_string(attempt))).lexically_normal();
            if (std::filesystem::create_directory(root))
                return;
        }
    }
    ~TemporaryDirectory() {
        std::error_code ignored;
        std::filesystem::remove_all(root, ignored);
    }
    TemporaryDirectory(const TemporaryDirectory&) = delete;
    TemporaryDirectory& operator=(const TemporaryDirectory&) = delete;

    const std::filesystem::path& path() const { return root; }
    std::wstring text() const { return root.wstring(); }

    /// Writes a file and returns its path.
    std::filesystem::path write(const std::filesystem::path& name, std::string_view content) const {
        const std::filesystem::path file = root / name;
        std::ofstream(file, std::ios::binary)
            .write(content.data(), static_cast<std::streamsize>(content.size()));
        return file;
    }

  private:
    std::filesystem::path root;
};

} // namespace Mz::Test

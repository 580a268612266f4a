// SPDX-License-Identifier: BSL-1.0
/// A zip archive for reading, through libzip.
#pragma once

#include <cstddef>
#include <cstdint>
#include <filesystem>
#include <memory>
#include <optional>
#include <stdexcept>
#include <string>
#include <vector>

struct zip;

/// Why an archive, or an entry of it, cannot be read.
class ZipError : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

/// A zip archive, open until it is destroyed. Used by one thread at a time.
class ZipArchive {
  public:
    /// Opens the archive `file`.
    ///
    /// \throws ZipError  if there is no such file or it is no archive
    explicit ZipArchive(const std::filesystem::path& file);

    /// Returns the names of the entries in the order of the archive, without folders.
    std::vector<std::string> names() const;

    /// Returns the content of the entry `name`; nothing if there is no such entry.
    ///
    /// \param most  largest size of the content. A small archive can hold a huge entry, and can lie
    ///     about its size.
    /// \throws ZipError  if the entry is larger or damaged
    std::optional<std::string> content(const std::string& name, std::size_t most) const;

  private:
    struct Close {
        void operator()(zip* archive) const;
    };
    std::unique_ptr<zip, Close> archive;
};

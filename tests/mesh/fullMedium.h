/// Places where files cannot be written, as far as the system has such.
#pragma once

#include <cstddef>
#include <filesystem>

namespace Meshes {

/// A folder that is there, in which nobody can make a file.
std::filesystem::path unwritableFolder();

/// Whether symbolic links and permissions can be relied on.
bool hasLinksAndPermissions();

/// While it lives, no file of this process grows beyond `size` bytes, as on a medium that is full.
class FullMedium {
  public:
    explicit FullMedium(std::size_t size);
    ~FullMedium();
    FullMedium(const FullMedium&) = delete;
    FullMedium& operator=(const FullMedium&) = delete;

    static bool isSupported();
};

} // namespace Meshes

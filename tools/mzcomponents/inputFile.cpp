// SPDX-License-Identifier: BSL-1.0
/// Queries the status before it opens the file, because opening a pipe would block, and opening a
/// folder fails with different errors on each system.
#include "tools/mzcomponents/inputFile.h"

#include <fstream>
#include <system_error>

namespace Mz::Commands {

std::wstring obstacleTo(const std::filesystem::path& file) {
    std::error_code failure;
    const std::filesystem::file_status status = std::filesystem::status(file, failure);
    if (failure == std::errc::permission_denied)
        return L"a folder above the file denies access";
    if (failure || !std::filesystem::exists(status))
        return L"there is no such file";
    if (std::filesystem::is_directory(status))
        return L"it is a folder, not a file";
    if (!std::filesystem::is_regular_file(status))
        return L"it is a pipe or a device, not a file";
    if (!std::ifstream(file, std::ios::binary))
        return L"the file cannot be read";
    return {};
}

} // namespace Mz::Commands

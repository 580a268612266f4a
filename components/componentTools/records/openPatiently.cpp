// SPDX-License-Identifier: BSL-1.0
/// Windows denies access to a file during a replacement, so a failure may be temporary. Each
/// attempt queries the status again, because the file may disappear or become something else.
#include "components/componentTools/records/openPatiently.h"

#include "components/platform/platform.h"

#include <chrono>
#include <optional>
#include <system_error>
#include <thread>

namespace Mz::Tools {

bool openPatiently(std::ifstream& stream, const std::filesystem::path& file) {
    constexpr int attempts = 50;
    for (int count = 0; count < attempts; ++count) {
        stream.clear();
        const std::optional<platform::FileStatus> status = platform::queryFile(file.native());
        if (!status || !status->regular)
            return false;
        if (platform::openForReading(stream, file.native()))
            return true;
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    return false;
}

bool isMissing(const std::filesystem::path& file) {
    std::error_code ignored;
    return std::filesystem::status(file, ignored).type() == std::filesystem::file_type::not_found;
}

} // namespace Mz::Tools

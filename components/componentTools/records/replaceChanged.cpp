// SPDX-License-Identifier: BSL-1.0
/// A replacement waits until the new file is on the disk, which takes longer than everything else
/// in a scan that finds nothing new. Reading the file does not.
#include "components/componentTools/records/replaceChanged.h"

#include "components/componentManager/files.h"
#include "components/platform/platform.h"

#include <cstdint>
#include <fstream>
#include <string>

namespace Mz::Tools {

namespace {

bool hasContent(const std::filesystem::path& file, std::string_view content) {
    const auto status = platform::queryFile(file.native());
    if (!status || !status->regular || status->size != static_cast<std::int64_t>(content.size()))
        return false;
    std::ifstream stream;
    if (!platform::openForReading(stream, file.native()))
        return false;
    std::string present(content.size(), '\0');
    stream.read(present.data(), static_cast<std::streamsize>(present.size()));
    return stream && present == content && stream.peek() == std::ifstream::traits_type::eof();
}

} // namespace

void replaceChanged(const std::filesystem::path& file, std::string_view content) {
    if (!hasContent(file, content))
        replaceFile(file, content);
}

} // namespace Mz::Tools

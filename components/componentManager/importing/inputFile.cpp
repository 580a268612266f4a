// SPDX-License-Identifier: BSL-1.0
/// Opens input files through the platform layer: standard file streams do not take wide names on
/// every platform, and on some they open directories.
#include "components/componentManager/importing/inputFile.h"

#include "components/platform/platform.h"

#include <optional>

namespace Mz {

bool openInputFile(std::ifstream& stream, const wchar_t* path) {
    if (!path || !*path)
        return false;
    const std::optional<platform::NativePath> native = platform::toNative(path);
    return native && platform::openForReading(stream, *native);
}

} // namespace Mz

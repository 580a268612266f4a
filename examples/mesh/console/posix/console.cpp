// SPDX-License-Identifier: BSL-1.0
/// On Linux names are bytes. The program stays in the "C" locale, so each byte is one wide
/// character and back again: every name passes through unchanged, whatever its encoding.
#include "../console.h"

#include "components/componentManager/nativeText.h"

namespace Meshes::console {

void useBinaryOutput() {}

std::string outputText(std::wstring_view text) {
    return Mz::toNarrow(text, '?');
}

} // namespace Meshes::console

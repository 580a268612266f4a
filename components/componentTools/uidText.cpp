// SPDX-License-Identifier: BSL-1.0
/// Writes the digits itself: the standard streams would use the locale's grouping.
#include "components/componentTools/uidText.h"

#include <cstdint>
#include <initializer_list>

namespace Mz::Tools {

std::wstring textOf(const QrUid& uid) {
    std::wstring text;
    for (const std::uint32_t word : {uid.w0, uid.w1, uid.w2, uid.w3}) {
        if (!text.empty())
            text += L'-';
        for (int shift = 28; shift >= 0; shift -= 4)
            text += L"0123456789ABCDEF"[word >> shift & 15];
    }
    return text;
}

} // namespace Mz::Tools

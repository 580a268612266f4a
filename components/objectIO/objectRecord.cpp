// SPDX-License-Identifier: BSL-1.0
/// Formats the positions and uids of the object IO's messages. Both IOs use them, so that the
/// reasons of their exceptions have one form.
#include "components/objectIO/objectRecord.h"

#include <cstdio>

namespace Mz {

std::string ObjectRecord::reason(int64 position, const std::string& what) {
    return (position < 0 ? "unknown position" : "byte " + std::to_string(position)) + ": " + what;
}

std::string ObjectRecord::text(const QrUid& uid) {
    char buffer[48];
    std::snprintf(buffer, sizeof buffer, "%08X-%08X-%08X-%08X", uid.w0, uid.w1, uid.w2, uid.w3);
    return buffer;
}

} // namespace Mz

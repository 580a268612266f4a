// SPDX-License-Identifier: BSL-1.0
/// Implements the root of castable objects.
///
/// The root counts nothing, so that static, local and member objects need no counter. The casts are
/// templates in the header; only the throw of the bad cast is compiled here, which keeps it out of
/// each call.
#include "components/componentManager/cast.h"

namespace Mz {

long QrCastable::newReference() {
    return 1;
}

long QrCastable::release() {
    return 1;
}

QrCastable::~QrCastable() = default;

void QrCastable::throwBadCast() {
    // Callers and logs rely on this position. It does not change with the lines of this file.
    constexpr int reportedLine = 71;
    throw QrComponentManagerEx::ExBadCast("components/componentManager/cast", reportedLine);
}

} // namespace Mz

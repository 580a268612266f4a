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
    // The position is part of what callers and logs rely on; it does not follow this file's lines.
    constexpr int reportedLine = 71;
    throw QrComponentManagerEx::ExBadCast("components/componentManager/cast", reportedLine);
}

} // namespace Mz

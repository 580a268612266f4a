/// How an object stands on a stream.
///
///     number                 0 for null, a known number for an object that was stored before, the
///                            next number for a new one, which then follows:
///       class identity       four words
///       version
///       …                    what the object writes
///       end mark             tells that the object read exactly what it had written
///
/// Every word is an `unsigned int` of the stream, so the record has the stream's own form.
#pragma once

#include "components/objectIO/objectIO.h"

#include <cstdint>
#include <string>

namespace Mz::ObjectRecord {

constexpr std::uint32_t null = 0;

constexpr std::uint32_t endMark(std::uint32_t number) {
    return 0x454F424Au ^ number;
}

/// "byte 123", or "unknown position" where the IO cannot tell.
inline std::string positionText(const QrBufferedIO& io) {
    const int64 position = io.tell();
    return position < 0 ? "unknown position" : "byte " + std::to_string(position);
}

/// The identity as it is written in sources and messages.
std::string text(const QrUid& uid);

} // namespace Mz::ObjectRecord

/// How an object stands on a stream.
///
///     number                 0 for null, a known number for an object that was stored before, the
///                            next number for a new one, which then follows:
///       class identity       four words
///       version
///       …                    what the object writes
///     end mark               tells that the object read exactly what it had written
///
/// Null and known objects have an end mark only where they stand in no other object: inside one,
/// the mark of that object guards them too.
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

/// "byte 123: what", or "unknown position: what" where the IO could not tell.
std::string reason(int64 position, const std::string& what);

/// The identity as it is written in sources and messages.
std::string text(const QrUid& uid);

} // namespace Mz::ObjectRecord

// SPDX-License-Identifier: BSL-1.0
/// The form of an object on a stream.
///
///     number                 0 for null, a known number for an object that was stored before, the
///                            next number for a new one, which then follows:
///       class identity       four words
///       version
///       …                    what the object writes
///     end mark               shows that the object has read exactly what it wrote
///
/// Null and known objects have an end mark only outside other objects: inside one, the mark of that
/// object covers them too.
///
/// Every word is an `unsigned int` of the stream, so the record has the form of the stream.
#pragma once

#include "components/objectIO/objectIO.h"

#include <cstdint>
#include <string>

namespace Mz::ObjectRecord {

constexpr std::uint32_t null = 0;

/// Returns the end mark of the object with this number.
constexpr std::uint32_t endMark(std::uint32_t number) {
    return 0x454F424Au ^ number;
}

/// Returns "byte 123: what", or "unknown position: what" for a negative position.
std::string reason(int64 position, const std::string& what);

/// Returns a uid in the form of messages: four words of eight hexadecimal digits, with hyphens.
std::string text(const QrUid& uid);

} // namespace Mz::ObjectRecord

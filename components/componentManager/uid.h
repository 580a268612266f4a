// SPDX-License-Identifier: BSL-1.0
/// The 128-bit identity of an interface, and the 64-bit integer type of the library.
#pragma once

#include <cstdint>

namespace Mz {

/// The signed 64-bit integer in all signatures of the library.
///
/// It is `long long` on both platforms. `std::int64_t` is `long` on one of them, and streams store
/// a `long` in 32 bits.
using int64 = long long;

/// The 128-bit identity of an interface or of a builder: four 32-bit words, in this order.
///
/// Two uids are equal if all four words are equal. They have no order. Interfaces of one family
/// often share three words and differ only in `w0`.
///
/// An interface declares both members:
///
///     static constexpr QrUid uid{...};
///     using Self = ThatInterface;
///
/// A class that only inherits `uid` is not the interface that `uid` identifies. `Self` reveals such
/// a class, and the casts reject it at compile time.
struct QrUid {
    std::uint32_t w0; ///< first word: in text, the first 8 digits
    std::uint32_t w1; ///< second word
    std::uint32_t w2; ///< third word
    std::uint32_t w3; ///< fourth word

    /// Returns whether all words are equal.
    friend constexpr bool operator==(const QrUid& a, const QrUid& b) noexcept = default;
};

} // namespace Mz

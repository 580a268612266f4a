/// The identity of an interface, and the library's own integer of 64 bits.
#pragma once

#include <cstdint>

namespace Mz {

/// The signed integer of 64 bits in every signature of the library. It is `long long` on both
/// platforms, because `std::int64_t` is `long` on one of them, which streams treat as 32 bits.
using int64 = long long;

/// The 128-bit identity of an interface or of a builder: four words of 32 bits, in this order.
///
/// Two identifiers are equal when all four words are; there is no order among them. Interfaces of
/// one family often share three words and differ in `w0` alone.
///
/// An interface carries its identity as `static constexpr QrUid uid` and names itself beside it
/// with `using Self = ThatInterface;`. Both are needed: a class that only inherits a `uid` from its
/// base is not the interface which that `uid` names, and the casts refuse it at compile time.
struct QrUid {
    std::uint32_t w0;
    std::uint32_t w1;
    std::uint32_t w2;
    std::uint32_t w3;

    friend constexpr bool operator==(const QrUid& a, const QrUid& b) noexcept = default;
};

} // namespace Mz

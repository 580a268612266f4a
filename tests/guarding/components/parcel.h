// SPDX-License-Identifier: BSL-1.0
/// The object that the hostile importers import.
#pragma once

#include "tests/components/plain.h"

#include <string>

namespace Mz::Test {

/// A text and two references to others, which may be shared and form circles.
class Parcel : public QrCastable {
  public:
    using Self = Parcel;
    static constexpr QrUid uid = testUid(0x40000);

    std::wstring text;
    QrPtr<Parcel> first, second;
};

inline constexpr QrUid parcelUid = testUid(0x40001);
/// Its objects throw when they are read.
inline constexpr QrUid fussyUid = testUid(0x40002);
/// No builder makes its objects.
inline constexpr QrUid strangerUid = testUid(0x40003);

} // namespace Mz::Test

// SPDX-License-Identifier: BSL-1.0
/// What the test component of the kit and the tests agree on.
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

#include <string>

namespace Mz::Test {

class Shape : public QrCastable {
  public:
    using Self = Shape;
    static constexpr QrUid uid = "4B7D1001-62AC-11EF-9E0B-3C5F8A21D7E4"_uid;
    virtual int corners() const = 0;
};

class Coloured : public QrCastable {
  public:
    using Self = Coloured;
    static constexpr QrUid uid = "4B7D1002-62AC-11EF-9E0B-3C5F8A21D7E4"_uid;
    virtual std::string colour() const = 0;
};

/// No class of the tests supports it.
class Sounding : public QrCastable {
  public:
    using Self = Sounding;
    static constexpr QrUid uid = "4B7D1003-62AC-11EF-9E0B-3C5F8A21D7E4"_uid;
    virtual int tone() const = 0;
};

inline constexpr QrUid squareUid = "4B7D1011-62AC-11EF-9E0B-3C5F8A21D7E4"_uid;
inline constexpr QrUid redSquareUid = "4B7D1012-62AC-11EF-9E0B-3C5F8A21D7E4"_uid;
inline constexpr QrUid countUid = "4B7D1013-62AC-11EF-9E0B-3C5F8A21D7E4"_uid;
inline constexpr QrUid fiveUid = "4B7D1014-62AC-11EF-9E0B-3C5F8A21D7E4"_uid;
inline constexpr QrUid importerUid = "4B7D1015-62AC-11EF-9E0B-3C5F8A21D7E4"_uid;

} // namespace Mz::Test

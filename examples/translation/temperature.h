// SPDX-License-Identifier: BSL-1.0
/// Two interfaces of one thing. The component is older than the second one.
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

using namespace Mz::literals; // "..."_uid

class Celsius : public Mz::QrCastable {
  public:
    using Self = Celsius;
    static constexpr Mz::QrUid uid = "D4071B01-7A44-11EF-A3C9-6E8215F0B97A"_uid;
    virtual int degreesCelsius() const = 0;
};

class Fahrenheit : public Mz::QrCastable {
  public:
    using Self = Fahrenheit;
    static constexpr Mz::QrUid uid = "D4071B02-7A44-11EF-A3C9-6E8215F0B97A"_uid;
    virtual int degreesFahrenheit() const = 0;
};

inline constexpr Mz::QrUid thermometerUid = "D4071B03-7A44-11EF-A3C9-6E8215F0B97A"_uid;

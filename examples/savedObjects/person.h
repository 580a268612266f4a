// SPDX-License-Identifier: BSL-1.0
/// What the component and its host agree on: an interface, and the identity of the class.
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

#include <string>
#include <vector>

using namespace Mz::literals; // "..."_uid

/// A person with children, of whom two persons may have the same.
class Person : public Mz::QrCastable {
  public:
    using Self = Person;
    static constexpr Mz::QrUid uid = "52E8A701-7A52-11EF-9D14-C06B3FE7821D"_uid;

    std::wstring name;
    unsigned int born = 0; ///< year
    std::vector<Mz::QrPtr<Person>> children;
};

/// The class of the objects, and its builder.
inline constexpr Mz::QrUid personUid = "52E8A702-7A52-11EF-9D14-C06B3FE7821D"_uid;

// SPDX-License-Identifier: BSL-1.0
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

using namespace Mz::literals; // "..."_uid

/// What host and component agree on: an interface, and the identity of the builder that makes it.
class Greeter : public Mz::QrCastable {
  public:
    using Self = Greeter;
    static constexpr Mz::QrUid uid = "6E1B0A01-4D1F-11EF-9C2A-7B105D3E8F41"_uid;

    virtual const char* greeting() const = 0;
};

inline constexpr Mz::QrUid worldGreeterUid = "6E1B0A02-4D1F-11EF-9C2A-7B105D3E8F41"_uid;

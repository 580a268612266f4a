// SPDX-License-Identifier: BSL-1.0
#pragma once

#include "components/componentManager/cast.h"

/// What host and component agree on: an interface, and the identity of the builder that makes it.
class Greeter : public Mz::QrCastable {
  public:
    using Self = Greeter;
    static constexpr Mz::QrUid uid{0x6E1B0A01, 0x4D1F11EF, 0x9C2A7B10, 0x5D3E8F41};

    virtual const char* greeting() const = 0;
};

inline constexpr Mz::QrUid worldGreeterUid{0x6E1B0A02, 0x4D1F11EF, 0x9C2A7B10, 0x5D3E8F41};

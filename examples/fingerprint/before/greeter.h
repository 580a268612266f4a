// SPDX-License-Identifier: BSL-1.0
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/fingerprint.h"

#include <string>

using namespace Mz::literals; // "..."_uid

/// The first version of the interface, as the author of an old component has it.
class Greeter : public Mz::QrCastable {
  public:
    using Self = Greeter;
    static constexpr Mz::QrUid uid = "5A9C2E01-8B3D-11EF-A7C4-2F60D18E4B95"_uid;

    virtual std::string greeting(const std::string& name) const = 0;
};
MZ_INTERFACE(Greeter, greeting)

inline constexpr Mz::QrUid frenchGreeterUid = "5A9C2E03-8B3D-11EF-A7C4-2F60D18E4B95"_uid;

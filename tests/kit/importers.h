// SPDX-License-Identifier: BSL-1.0
/// What the test components with import builders and the tests agree on.
///
/// The input of these builders is a script: `A=take;B=null`. Each builder has a letter, accepts the
/// input if the script names the letter, and then does what the script says (`importers.cpp`).
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

#include <string>

namespace Mz::Test {

/// The interface of the imported objects.
class Words : public QrCastable {
  public:
    using Self = Words;
    static constexpr QrUid uid = "9D2E6001-70B4-4C1E-8A57-2F40C3D1E6B8"_uid;
    virtual const std::wstring& words() const = 0;
};

/// Builders of the family "script": the first two are in one library, the third in another.
inline constexpr QrUid alphaUid = "9D2E6011-70B4-4C1E-8A57-2F40C3D1E6B8"_uid;
inline constexpr QrUid betaUid = "9D2E6012-70B4-4C1E-8A57-2F40C3D1E6B8"_uid;
inline constexpr QrUid gammaUid = "9D2E6013-70B4-4C1E-8A57-2F40C3D1E6B8"_uid;

/// Builders of the family "odd": one is not an import builder, one cannot list its extensions, one
/// is as the others.
inline constexpr QrUid plainUid = "9D2E6021-70B4-4C1E-8A57-2F40C3D1E6B8"_uid;
inline constexpr QrUid listlessUid = "9D2E6022-70B4-4C1E-8A57-2F40C3D1E6B8"_uid;
inline constexpr QrUid deltaUid = "9D2E6023-70B4-4C1E-8A57-2F40C3D1E6B8"_uid;

} // namespace Mz::Test

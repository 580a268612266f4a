// SPDX-License-Identifier: BSL-1.0
/// The interface of the tools.
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

using namespace Mz::literals; // "..."_uid

/// A tool of a drawing program.
class Tool : public Mz::QrCastable {
  public:
    using Self = Tool;
    static constexpr Mz::QrUid uid = "C2A4E201-7D11-11EF-9B6B-5A1F6F0E6D0C"_uid;

    /// Uses the tool.
    virtual void use() = 0;
};

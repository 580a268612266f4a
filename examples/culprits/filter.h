// SPDX-License-Identifier: BSL-1.0
/// The interface of the filters.
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

#include <string>

using namespace Mz::literals; // "..."_uid

/// Changes the text of an editor.
class Filter : public Mz::QrCastable {
  public:
    using Self = Filter;
    static constexpr Mz::QrUid uid = "C4081CC3-FEB0-44A4-87BA-EAE9AADC696F"_uid;

    /// Changes `text`.
    /// \throws std::exception if the filter cannot change it
    virtual void apply(std::string& text) = 0;
};

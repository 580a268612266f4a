// SPDX-License-Identifier: BSL-1.0
/// What the component and its host agree on: a task that takes long.
#pragma once

#include "components/componentKit/uidLiteral.h"
#include "components/componentManager/cast.h"

using namespace Mz::literals; // "..."_uid

/// Counts prime numbers.
class Counter : public Mz::QrCastable {
  public:
    using Self = Counter;
    static constexpr Mz::QrUid uid = "A91D6C01-7A3B-11EF-8E55-2B74D0C19F68"_uid;

    /// Returns how many prime numbers are below `limit`, or -1 if the work was stopped. Reports to
    /// the process controller of the calling thread.
    ///
    /// \throws whatever the controller's `abort` throws, if `limit` is negative
    virtual int primesBelow(int limit) = 0;
};

inline constexpr Mz::QrUid counterUid = "A91D6C02-7A3B-11EF-8E55-2B74D0C19F68"_uid;

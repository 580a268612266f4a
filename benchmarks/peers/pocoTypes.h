// SPDX-License-Identifier: BSL-1.0
/// The interface and the object of the casts with POCO, in a library of their own.
#pragma once

#include "components/base/export.h"

#include <Poco/RefCountedObject.h>

namespace Mz::Benchmarks {

class MZ_SHARED_TYPE PocoGauge : public Poco::RefCountedObject {
  public:
    virtual long value() const = 0;

  protected:
    ~PocoGauge() override;
};

/// Returns a new object with the interface `PocoGauge` and one reference, which the caller owns.
MZ_EXPORT Poco::RefCountedObject* newPocoGauge();

} // namespace Mz::Benchmarks

// SPDX-License-Identifier: BSL-1.0
// Defines the object in a separate library, as `peer.cpp` does.
#include "pocoTypes.h"

namespace Mz::Benchmarks {

PocoGauge::~PocoGauge() = default;

namespace {

class SomePocoGauge final : public PocoGauge {
  public:
    long value() const override { return 1; }
};

} // namespace

Poco::RefCountedObject* newPocoGauge() {
    return new SomePocoGauge;
}

} // namespace Mz::Benchmarks

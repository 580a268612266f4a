// SPDX-License-Identifier: BSL-1.0
// Defines the objects of peer.h in a separate library.
#include "peer.h"

namespace Mz::Benchmarks {

SharedRoot::~SharedRoot() = default;
SharedGauge::~SharedGauge() = default;
SharedAbsent::~SharedAbsent() = default;

namespace {

class UncountedGauge final : public QrCastImpl<UncountedGauge, Gauge> {
  public:
    long value() const override { return 1; }
};

class CountedGauge final : public QrCastRef<QrCastHeap<QrCastImpl<CountedGauge, Gauge>>> {
  public:
    long value() const override { return 1; }
};

class SomeCalls final : public Calls {
  public:
    long first() override { return 1; }
    long second() override { return 1; }
    long third() override { return 1; }
};

class SomeSharedGauge final : public SharedGauge {
  public:
    long value() const override { return 1; }
};

/// Has the size of a counted object.
class SomeProduct final : public Product {
  public:
    long value() const override { return count; }

  private:
    int count = 1;
};

class SomeFactory final : public Factory {
  public:
    Product* make() override { return new SomeProduct; }
};

} // namespace

QrCastable* uncountedGauge() {
    static UncountedGauge gauge;
    return &gauge;
}

QrCastable* newCountedGauge() {
    return new CountedGauge;
}

Calls* calls() {
    static SomeCalls some;
    return &some;
}

std::shared_ptr<SharedRoot> newSharedGauge() {
    return std::make_shared<SomeSharedGauge>();
}

Factory* factory() {
    static SomeFactory some;
    return &some;
}

void* trivialCall() {
    static int anything;
    return &anything;
}

} // namespace Mz::Benchmarks

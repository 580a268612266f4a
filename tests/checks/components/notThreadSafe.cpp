// SPDX-License-Identifier: BSL-1.0
/// Fails when several threads use a builder.
#include "tests/checks/components/broken.h"
#include "tests/checks/components/oneThread.h"

class Builder final : public Mz::Test::Building<Builder> {
  public:
    Mz::QrRef<Mz::QrCastable> createObject() override {
        return oneThread.isAlone() ? Building::createObject() : nullptr;
    }

  private:
    Mz::Test::OneThread oneThread;
};

MZ_BROKEN_BUILDER(Builder)

// SPDX-License-Identifier: BSL-1.0
/// Needs standard input.
#include "tests/checks/components/broken.h"

#include "tests/checks/components/system.h"

class Builder final : public Mz::Test::Building<Builder> {
  public:
    Mz::QrRef<Mz::QrCastable> createObject() override {
        return Mz::Test::hasStandardInput() ? Building::createObject() : nullptr;
    }
};

MZ_BROKEN_BUILDER(Builder)

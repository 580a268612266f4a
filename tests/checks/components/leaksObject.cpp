// SPDX-License-Identifier: BSL-1.0
/// Returns objects with one reference too many.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Building<Builder> {
  public:
    Mz::QrRef<Mz::QrCastable> createObject() override {
        auto* const object = new Mz::Test::Stored;
        object->newReference();
        return object->getCastable();
    }
};

MZ_BROKEN_BUILDER(Builder)

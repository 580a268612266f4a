// SPDX-License-Identifier: BSL-1.0
/// Throws a standard exception when it makes an object.
#include "tests/checks/components/broken.h"

#include <stdexcept>

class Builder final : public Mz::Test::Building<Builder> {
  public:
    Mz::QrRef<Mz::QrCastable> createObject() override {
        throw std::runtime_error("no object today");
    }
};

MZ_BROKEN_BUILDER(Builder)

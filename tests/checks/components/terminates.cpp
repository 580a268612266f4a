// SPDX-License-Identifier: BSL-1.0
/// Ends the process if an allocation fails.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Building<Builder> {
  public:
    Mz::QrRef<Mz::QrCastable> createObject() override { return made(); }

  private:
    Mz::QrRef<Mz::QrCastable> made() noexcept { return (new Mz::Test::Stored)->getCastable(); }
};

MZ_BROKEN_BUILDER(Builder)

// SPDX-License-Identifier: BSL-1.0
/// Returns itself with one reference too many.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Building<Builder> {
  public:
    Mz::QrRefPtr<Mz::QrComponentBuilder> getBuilder() override {
        newReference();
        return this;
    }
    using Building::getBuilder;
    Mz::QrRef<Mz::QrCastable> createObject() override { return nullptr; }
};

using Mz::Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    Mz::QrRef<Mz::QrCastable> createBuilder(const Mz::QrUid& uid) override {
        static Builder* const builder = new Builder;
        static const Mz::QrPtr<Builder> kept(builder);
        if (!(uid == Mz::Test::brokenUid))
            return nullptr;
        return builder->getCastable();
    }
};

MZ_BROKEN_DESCRIPTION(Description)

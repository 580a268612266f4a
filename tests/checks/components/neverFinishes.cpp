// SPDX-License-Identifier: BSL-1.0
/// Does not say when its enumeration is finished, and has a builder that does not return itself.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Building<Builder> {
  public:
    using Building::getBuilder;
    Mz::QrRefPtr<Mz::QrComponentBuilder> getBuilder() override { return nullptr; }
};

using Mz::Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    Mz::QrRef<Mz::QrCastable> createBuilder(const Mz::QrUid& uid) override {
        return uid == Mz::Test::brokenUid ? (new Builder)->getCastable() : nullptr;
    }
    Mz::QrEnum::Action
    enumerateBuilders(Mz::QrEnumerator<Mz::QrCPtr<Mz::QrBuilderDescription>>& e) override {
        for (const Mz::Test::PlainInfo& info : builders)
            if (const Mz::QrEnum::Action action =
                    e.process(Mz::QrPtr<Mz::Test::PlainBuilderDescription>(
                        new Mz::Test::PlainBuilderDescription(info))))
                return action;
        return Mz::QrEnum::Continue;
    }
};

MZ_BROKEN_DESCRIPTION(Description)

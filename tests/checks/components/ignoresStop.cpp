// SPDX-License-Identifier: BSL-1.0
/// Goes on with an enumeration that was stopped.
#include "tests/checks/components/broken.h"

using Mz::Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    Mz::QrEnum::Action
    enumerateBuilders(Mz::QrEnumerator<Mz::QrCPtr<Mz::QrBuilderDescription>>& e) override {
        for (const Mz::Test::PlainInfo& info : builders)
            e.process(Mz::QrPtr<Mz::Test::PlainBuilderDescription>(
                new Mz::Test::PlainBuilderDescription(info)));
        return e.finished();
    }
};

MZ_BROKEN_DESCRIPTION(Description)

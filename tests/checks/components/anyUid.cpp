// SPDX-License-Identifier: BSL-1.0
/// Makes a builder for every uid whose first three words are right.
#include "tests/checks/components/broken.h"

using Mz::Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    Mz::QrRef<Mz::QrCastable> createBuilder(const Mz::QrUid& uid) override {
        Mz::QrUid right = uid;
        right.w3 = Mz::Test::brokenUid.w3;
        return PlainDescription::createBuilder(right);
    }
};

MZ_BROKEN_DESCRIPTION(Description)

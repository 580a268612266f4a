// SPDX-License-Identifier: BSL-1.0
/// Makes a builder that says it is another one.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Building<Builder> {
  public:
    Mz::QrRef<Mz::QrCastable> createObject() override { return nullptr; }
};

using Mz::Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    Description()
        : PlainDescription("broken", {{Mz::Test::testUid(0x5E1), L"broken", L"Broken", L""}}) {}
    Mz::QrRef<Mz::QrCastable> createBuilder(const Mz::QrUid& uid) override {
        if (!(uid == Mz::Test::testUid(0x5E1)))
            return nullptr;
        return (new Builder)->getCastable();
    }
};

MZ_PLAIN_ENTRY_POINT(Description)

// SPDX-License-Identifier: BSL-1.0
/// Returns a counted object of another kind instead of a builder.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrRef<QrCastable> createBuilder(const QrUid&) override {
        return QrPtr<NamedObject>(new NamedObject("wrong"));
    }
};

MZ_PLAIN_ENTRY_POINT(Description, "creates wrong", {{createsWrongUid, L"creates wrong"}})

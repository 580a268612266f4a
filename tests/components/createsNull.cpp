// SPDX-License-Identifier: BSL-1.0
// Returns null instead of a builder.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrRef<QrCastable> createBuilder(const QrUid&) override { return nullptr; }
};

MZ_PLAIN_ENTRY_POINT(Description, "creates null", {{createsNullUid, L"creates null"}})

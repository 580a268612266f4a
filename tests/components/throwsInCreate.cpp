// SPDX-License-Identifier: BSL-1.0
// Throws when it creates a builder.
#include "tests/components/testUids.h"

#include <stdexcept>

using namespace Mz;
using namespace Mz::Test;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrRef<QrCastable> createBuilder(const QrUid&) override {
        throw std::runtime_error("no builder today");
    }
};

MZ_PLAIN_ENTRY_POINT(Description, "create throws", {{createThrowsUid, L"create throws"}})

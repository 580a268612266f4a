// SPDX-License-Identifier: BSL-1.0
// Offers null after its builders.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        PlainDescription::enumerateBuilders(e);
        return e.process(nullptr);
    }
};

MZ_PLAIN_ENTRY_POINT(Description, "null", {{faultyUid, L"faulty"}})

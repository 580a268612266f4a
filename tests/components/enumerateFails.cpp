// SPDX-License-Identifier: BSL-1.0
/// Returns Fail from its enumeration, after it has offered all builders.
#include "tests/components/testUids.h"

using namespace Mz;
using namespace Mz::Test;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        PlainDescription::enumerateBuilders(e);
        return QrEnum::Fail;
    }
};

MZ_PLAIN_ENTRY_POINT(Description, "fails", {{faultyUid, L"fails"}})

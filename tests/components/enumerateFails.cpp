// SPDX-License-Identifier: BSL-1.0
/// Ends its enumeration with a failure, which says nothing about the builders it offered.
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

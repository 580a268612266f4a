// SPDX-License-Identifier: BSL-1.0
// Is slow when it returns the text of its description, and after it has described its builder.
#include "tests/tools/components/sleeps.h"

namespace {

using Mz::Test::PlainDescription;

using namespace Mz;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    const wchar_t* getComponentText() override {
        Mz::Test::sleepLong();
        return L"slow";
    }
    QrEnum::Action enumerateBuilders(QrEnumerator<QrCPtr<QrBuilderDescription>>& e) override {
        const QrEnum::Action action = PlainDescription::enumerateBuilders(e);
        Mz::Test::sleepLong();
        return action;
    }
};

} // namespace

MZ_PLAIN_ENTRY_POINT(Description, "sleeps", {{Mz::Test::testUid(0x41002), L"sleeps"}})

// SPDX-License-Identifier: BSL-1.0
// Is slow when it returns the text of its description.
#include "tests/tools/components/sleeps.h"

namespace {

using Mz::Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    const wchar_t* getComponentText() override {
        Mz::Test::sleepLong();
        return L"slow";
    }
};

} // namespace

MZ_PLAIN_ENTRY_POINT(Description, "sleeps", {{Mz::Test::testUid(0x41002), L"sleeps"}})

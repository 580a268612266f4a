// SPDX-License-Identifier: BSL-1.0
// Returns null for every text.
#include "tests/components/testUids.h"

using namespace Mz::Test;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    const wchar_t* getComponentLabel() override { return nullptr; }
    const wchar_t* getComponentText() override { return nullptr; }
};

MZ_PLAIN_ENTRY_POINT(Description, "null texts",
                     {{nullTextsUid, nullptr, nullptr, nullptr, 5, true}})

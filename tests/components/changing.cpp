// SPDX-License-Identifier: BSL-1.0
/// A library in the version MZ_TEST_VERSION, 1 or 2. Version 2 has a second builder.
#include "tests/components/testUids.h"

using namespace Mz::Test;

static std::vector<PlainInfo> versionsBuilders() {
    if (MZ_TEST_VERSION == 1)
        return {{changingUid, L"version one"}};
    return {{changingUid, L"version two"}, {changingSecondUid, L"new in two"}};
}

class Description final : public PlainDescription {
  public:
    Description() : PlainDescription("changing", versionsBuilders()) {}
    const wchar_t* getComponentLabel() override {
        return MZ_TEST_VERSION == 1 ? L"Label one" : L"Label two";
    }
};

MZ_PLAIN_ENTRY_POINT(Description)

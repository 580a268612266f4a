// SPDX-License-Identifier: BSL-1.0
/// States MZ_TEST_COUNT builders but offers another number.
#include "tests/components/testUids.h"

using namespace Mz::Test;

static std::vector<PlainInfo> miscounted() {
    std::vector<PlainInfo> infos;
    for (std::uint32_t index = 0; index < howManyMiscounted; ++index)
        infos.push_back({testUid(firstOfMiscounted + index), L"miscounted", L"", L"", index});
    return infos;
}

class Description final : public PlainDescription {
  public:
    Description() : PlainDescription("liar", miscounted()) {}
    unsigned int getBuilderCount() override {
        note("counted");
        return MZ_TEST_COUNT;
    }
};

MZ_PLAIN_ENTRY_POINT(Description)

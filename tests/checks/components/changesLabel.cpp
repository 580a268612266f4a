// SPDX-License-Identifier: BSL-1.0
/// Describes itself with another label at each call.
#include "tests/checks/components/broken.h"

using Mz::Test::PlainDescription;

class Description final : public PlainDescription {
  public:
    using PlainDescription::PlainDescription;
    const wchar_t* getComponentLabel() override {
        label = L"Label " + std::to_wstring(++calls);
        return label.c_str();
    }

  private:
    std::wstring label;
    int calls = 0;
};

MZ_BROKEN_DESCRIPTION(Description)

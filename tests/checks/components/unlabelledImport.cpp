// SPDX-License-Identifier: BSL-1.0
/// Has an import builder that is an empty line in the list of file types.
#include "tests/checks/components/broken.h"

class Builder final : public Mz::Test::Importing<Builder> {
  public:
    const wchar_t* getLabel() const override { return L""; }
};

MZ_BROKEN_BUILDER(Builder)

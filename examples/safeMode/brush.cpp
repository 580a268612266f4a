// SPDX-License-Identifier: BSL-1.0
/// A tool of the host itself.
#include "tool.h"

#include "components/componentKit/componentKit.h"

#include <iostream>

using namespace Mz;

namespace {

class Brush final : public Kit::Object<Brush, Tool> {
  public:
    void use() override { std::cout << "The brush paints.\n"; }
};

} // namespace

MZ_COMPONENT(L"Brush", L"Paints",
             Kit::builderOf<Brush>({.uid = "C2A4E202-7D11-11EF-9B6B-5A1F6F0E6D0C"_uid,
                                    .name = L"tool",
                                    .label = L"Brush"}))

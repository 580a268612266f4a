// SPDX-License-Identifier: BSL-1.0
/// A tool of a third party, which takes its host down when it is used. A scan cannot show that: the
/// tool loads and describes itself without a fault.
#include "tool.h"

#include "components/componentKit/componentKit.h"

#include <cstdlib>
#include <iostream>

using namespace Mz;

namespace {

class Cloud final : public Kit::Object<Cloud, Tool> {
  public:
    void use() override {
        std::cout << "The cloud ends the program." << std::endl;
        std::_Exit(3); // As a crash does, it runs no destructor.
    }
};

} // namespace

MZ_COMPONENT(L"Cloud", L"Stores drawings elsewhere",
             Kit::builderOf<Cloud>({.uid = "C2A4E203-7D11-11EF-9B6B-5A1F6F0E6D0C"_uid,
                                    .name = L"tool",
                                    .label = L"Cloud"}))

// SPDX-License-Identifier: BSL-1.0
/// Turns ASCII letters into capitals.
#include "filter.h"

#include "components/componentKit/componentKit.h"

using namespace Mz;

namespace {

class Shout final : public Kit::Object<Shout, Filter> {
  public:
    void apply(std::string& text) override {
        for (char& character : text)
            if (character >= 'a' && character <= 'z')
                character = static_cast<char>(character - 'a' + 'A');
    }
};

} // namespace

MZ_COMPONENT(L"Shout", L"Writes in capitals",
             Kit::builderOf<Shout>({.uid = "50B93478-6857-4D23-8174-A05A57C1B4BD"_uid,
                                    .name = L"filter",
                                    .label = L"Shout"}))

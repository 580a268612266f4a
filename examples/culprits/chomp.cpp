// SPDX-License-Identifier: BSL-1.0
/// Removes empty lines at the end, and the end of the last line with them.
#include "filter.h"

#include "components/componentKit/componentKit.h"

using namespace Mz;

namespace {

class Chomp final : public Kit::Object<Chomp, Filter> {
  public:
    void apply(std::string& text) override {
        while (!text.empty() && text.back() == '\n')
            text.pop_back();
    }
};

} // namespace

MZ_COMPONENT(L"Chomp", L"Removes the end of the last line",
             Kit::builderOf<Chomp>({.uid = "2FAE5425-215C-427C-A84B-0F1A4F36ACC7"_uid,
                                    .name = L"filter",
                                    .label = L"Chomp"}))

// SPDX-License-Identifier: BSL-1.0
/// Marks a text as a quotation.
#include "filter.h"

#include "components/componentKit/componentKit.h"

using namespace Mz;

namespace {

class Quote final : public Kit::Object<Quote, Filter> {
  public:
    void apply(std::string& text) override { text = "> " + text; }
};

} // namespace

MZ_COMPONENT(L"Quote", L"Quotes a text",
             Kit::builderOf<Quote>({.uid = "7859627A-EE2C-4A7B-AB59-BDD6E8BD7FBC"_uid,
                                    .name = L"filter",
                                    .label = L"Quote"}))

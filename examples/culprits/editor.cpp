// SPDX-License-Identifier: BSL-1.0
/// The product: applies every filter to a text. It ends with 1 if one fails, without a word on
/// which.
#include "filter.h"

#include "components/componentKit/hostKit.h"

#include <exception>
#include <iostream>

using namespace Mz;

int main() {
    // A search passes a temporary list, in which some components are switched off.
    Kit::readList(Kit::listFromEnvironment("editor.list"));
    Kit::initialize(Kit::programFolder() / "components");
    std::string text = "plug-ins\nare apart\n";
    try {
        for (const auto& builder : Kit::builders())
            if (const auto filter = Kit::create<Filter>(builder->getUid()))
                filter->apply(text);
    } catch (const std::exception&) {
        std::cout << "The text cannot be shown.\n";
        return 1;
    }
    std::cout << text << '\n';
}

// SPDX-License-Identifier: BSL-1.0
#include "components/componentKit/hostKit.h"
#include "greeter.h"
#include <iostream>

int main() {
    const auto folder = Mz::Kit::initialize(Mz::Kit::programFolder() / "components");
    const auto greeter = Mz::Kit::create<Greeter>(worldGreeterUid);
    std::cout << (greeter ? greeter->greeting() : "no greeter was found in " + Mz::utf8Name(folder))
              << '\n';
    return greeter ? 0 : 1;
}

// SPDX-License-Identifier: BSL-1.0
#include "greeter.h"

#include "components/componentKit/hostKit.h"
#include "components/componentManager/componentImp.h"

#include <iostream>

int main(int argc, char** argv) {
    const std::filesystem::path components = argc > 1 ? argv[1] : "components";
    QrGetComponentManager()->initialize(Mz::Kit::searchPath(components).c_str());

    const Mz::QrRef<Mz::QrCastable> object = QrGetComponentManager()->createObject(worldGreeterUid);
    const auto greeter = Mz::queryCast<Greeter>(object.get());
    std::cout << (greeter ? greeter->greeting() : "no greeter was found") << std::endl;
}

#include "greeter.h"

#include "components/componentManager/componentImp.h"

#include <filesystem>
#include <iostream>

int main(int argc, char** argv) {
    const std::filesystem::path components = argc > 1 ? argv[1] : "components";
    const std::wstring path = std::filesystem::absolute(components).lexically_normal().wstring();
    QrGetComponentManager()->initialize(path.c_str());

    const Mz::QrRef<Mz::QrCastable> object = QrGetComponentManager()->createObject(worldGreeterUid);
    const auto greeter = Mz::queryCast<Greeter>(object.get());
    std::cout << (greeter ? greeter->greeting() : "no greeter was found") << std::endl;
}

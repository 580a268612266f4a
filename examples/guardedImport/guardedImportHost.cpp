// SPDX-License-Identifier: BSL-1.0
/// The host: imports the files that it is given, each in a child process.
#include "palette.h"

#include "components/componentKit/hostKit.h"
#include "components/componentTools/guardedImport.h"

#include <iostream>

using namespace Mz;

int main(int argc, char** argv) {
    Kit::initialize(Kit::programFolder() / "components");
    Kit::Controller controller;
    const Kit::ControllerScope installed(controller);

    Kit::ImportLimits limits;
    limits.time = std::chrono::seconds(20);
    limits.builderName = L"palette";
    limits.classes = {storedPaletteUid};

    int failures = 0;
    for (int index = 1; index < argc; ++index) {
        const Kit::GuardedImport import = Kit::importGuarded(argv[index], limits);
        if (const auto palette = queryCast<Palette>(import.object.get())) {
            std::cout << argv[index] << ": " << palette->colours.size() << " colours" << std::endl;
            continue;
        }
        ++failures;
        std::cout << argv[index] << ": " << nameOf(import.verdict) << " in "
                  << toNarrow(import.activity, '?') << std::endl;
    }
    return failures == 0 ? 0 : 1;
}

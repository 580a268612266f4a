// SPDX-License-Identifier: BSL-1.0
/// Finds the components with which the editor fails. A product's tests can do that each night.
#include "components/componentKit/hostKit.h"
#include "components/componentTools/bisect.h"
#include "components/componentTools/discovery.h"

#include <iostream>

using namespace Mz;

int main() {
    const std::filesystem::path folder = Kit::programFolder();
    Tools::BisectOptions options;
    options.folders = Tools::foldersOf(folder / "components");
    options.host = folder / "editor" PROGRAM_SUFFIX;
    options.started = [](const Tools::HostStart& start) {
        std::cout << "start " << start.number << " with " << start.active
                  << " components: " << (start.failed ? "fails" : "works") << '\n';
    };
    const Tools::BisectResult result = Tools::bisect(options);
    if (result.state != Tools::BisectResult::State::found) {
        std::cout << "No component is the reason.\n";
        return 0;
    }
    std::cout << "The editor fails with:\n";
    for (const Tools::Culprit& culprit : result.culprits)
        std::cout << "  " << culprit.path.stem().string() << '\n';
    return 1;
}

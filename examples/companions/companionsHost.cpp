// SPDX-License-Identifier: BSL-1.0
/// The host: imports models under a policy, and prints them and what the import did.
#include "model.h"

#include "components/componentKit/hostKit.h"

#include <chrono>
#include <iostream>

using namespace Mz;

namespace {

/// Shows nothing: the result of an import has the reasons.
class Silent final : public Kit::Controller {
    void show(Kind, const wchar_t*) override {}
};

void print(const Model& model) {
    std::cout << "  " << model.vertexCount() << " vertices\n";
    for (const Model::Material& material : model.materials())
        std::cout << "  " << material.name << " (" << material.red << ' ' << material.green << ' '
                  << material.blue << "), faces: " << material.faces << '\n';
}

} // namespace

int main(int argc, char** argv) {
    Kit::initialize(Kit::programFolder() / "components");
    Silent silent;
    const Kit::ControllerScope installed(silent);

    Kit::ImportPolicy policy;
    policy.byteLimit = 10'000'000;
    policy.timeLimit = std::chrono::minutes(1);
    policy.companions = Kit::Companions::beside; // An OBJ file can name any file of the system.

    bool all = true;
    for (int index = 1; index < argc; ++index) {
        const Kit::ImportResult result = Kit::importFile(modelBuilders, argv[index], policy);
        std::cout << toNarrow(Kit::describe(result), '?') << '\n';
        if (const auto model = queryCast<Model>(result.object.get()))
            print(*model);
        all = all && result;
    }
    return all ? 0 : 1;
}

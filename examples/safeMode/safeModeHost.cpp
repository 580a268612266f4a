// SPDX-License-Identifier: BSL-1.0
/// A host that survives its third-party components: after a run that did not end well, it offers to
/// begin without them.
///
///     safeModeHost [--safe]
///
/// A real host asks its user. Here, the argument is the answer.
#include "tool.h"

#include "components/componentKit/hostKit.h"
#include "components/componentTools/start.h"

#include <iostream>
#include <string_view>

using namespace Mz;

namespace {

Kit::StartMode offerSafeMode(const Kit::UncleanEnd& end, bool accepted) {
    std::cout << "The last run did not end well. Begin without these? " << (accepted ? "yes" : "no")
              << '\n';
    for (const std::filesystem::path& file : end.thirdParty)
        std::cout << "  " << file.stem().string() << '\n';
    return accepted ? Kit::StartMode::withoutThirdParty : Kit::StartMode::asAlways;
}

} // namespace

int main(int count, char** arguments) {
    const bool accepted = count > 1 && std::string_view(arguments[1]) == "--safe";
    Kit::StartOptions options;
    options.list = Kit::listFromEnvironment("components.list");
    options.searchPath = Kit::programFolder() / "components";
    options.isOwn = [](const std::filesystem::path& file) { return file.stem() == "brush"; };
    options.afterUncleanEnd = [&](const Kit::UncleanEnd& end) {
        return offerSafeMode(end, accepted);
    };
    const Kit::Started started = Kit::start(options);
    if (!started.problem().empty())
        std::wcerr << started.problem() << std::endl;

    for (const auto& builder : Kit::builders())
        if (const auto tool = Kit::create<Tool>(builder->getUid()))
            tool->use();
    std::cout << "The end.\n";
} // The end of `started` is the clean end.

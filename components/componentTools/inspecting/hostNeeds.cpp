// SPDX-License-Identifier: BSL-1.0
/// A Windows library names the program from which it imports. A Linux library only has an undefined
/// symbol, which is detected by searching all dependencies for it. That takes a look-up for each
/// symbol and library, so it is done only after a load has failed, not for each file of a folder.
#include "components/componentTools/inspecting/hostNeeds.h"

#include "components/componentTools/platform/system.h"
#include "components/platform/platform.h"

#include <set>
#include <string>
#include <utility>

namespace Mz::Tools {

std::optional<Finding> programOfHost(const LibraryImage& image,
                                     const std::vector<Dependency>& dependencies) {
    if (image.format != ImageFormat::pe)
        return std::nullopt;
    for (const Dependency& dependency : dependencies)
        if (platform::lowerCase(dependency.name).ends_with(L".exe"))
            return Finding{Verdict::needsHost, dependency.name, {}};
    return std::nullopt;
}

std::optional<Finding> symbolOfHost(const std::filesystem::path& file,
                                    const std::vector<Dependency>& dependencies) {
    std::vector<std::filesystem::path> libraries{file};
    for (const Dependency& dependency : dependencies) {
        const auto path = platform::toNative(dependency.path);
        if (dependency.path.empty() || !path)
            return std::nullopt;
        libraries.emplace_back(*path);
    }
    std::vector<std::string> wanted;
    for (const std::filesystem::path& library : libraries)
        for (std::string& name : wantedSymbols(library))
            wanted.push_back(std::move(name));
    std::set<std::string> undefined(wanted.begin(), wanted.end());
    for (const std::filesystem::path& library : libraries)
        if (!removeDefined(library, undefined))
            return std::nullopt;
    for (const std::string& name : wanted)
        if (undefined.contains(name))
            return Finding{Verdict::needsHost, System::displayName(System::pathOfArgument(name)),
                           L", a symbol that no library it needs defines"};
    return std::nullopt;
}

} // namespace Mz::Tools

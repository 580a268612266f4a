// SPDX-License-Identifier: BSL-1.0
/// Checks the cheapest properties first: attributes, then the content, then the encoding of the
/// name. Dependencies are followed like the loader does, breadth first, because the order decides
/// which file a name leads to.
#include "components/componentTools/inspecting/inspection.h"

#include "components/componentManager/nativeText.h"
#include "components/componentTools/inspecting/abiDifference.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/recordedList.h"
#include "components/platform/platform.h"

#include <deque>
#include <map>
#include <set>
#include <system_error>
#include <utility>

namespace Mz::Tools {

namespace {

std::optional<Finding> judgePlace(const std::filesystem::path& file) {
    const System::FileAttributes attributes = System::fileAttributes(file);
    if (attributes.directory)
        return Finding{Verdict::directory, {}, {}};
    const auto status = platform::queryFile(file.native());
    if (!status)
        return Finding{verdictOnAbsence(file), {}, {}};
    if (attributes.hidden)
        return Finding{Verdict::hidden, {}, {}};
    if (attributes.system)
        return Finding{Verdict::systemFile, {}, {}};
    if (!status->regular)
        return Finding{Verdict::notRegular, {}, {}};
    return std::nullopt;
}

bool isNameCarried(const std::filesystem::path& file) {
    const auto name = toWideName(file);
    return name && isCarried(*name);
}

Finding judgeImage(const LibraryImage& image) {
    if (!image.readable)
        return {Verdict::unreadable, {}, {}};
    if (image.format == ImageFormat::none || image.kind == LibraryImage::Kind::other)
        return {Verdict::notALibrary, {}, {}};
    if (image.format != System::ownFormat())
        return {Verdict::otherSystem, image.format == ImageFormat::elf ? L"Linux" : L"Windows", {}};
    if (!image.otherProcessor.empty())
        return {Verdict::otherProcessor, image.otherProcessor, {}};
    if (image.kind == LibraryImage::Kind::program)
        return {Verdict::program, {}, {}};
    if (!image.damage.empty())
        return {Verdict::damaged, image.damage, {}};
    switch (image.entryPoint) {
    case LibraryImage::EntryPoint::absent: return {Verdict::noEntryPoint, {}, {}};
    case LibraryImage::EntryPoint::noFunction: return {Verdict::entryPointNoFunction, {}, {}};
    default: return abiDifference(image).value_or(Finding{Verdict::component, {}, {}});
    }
}

std::wstring toText(const std::string& name) {
    return displayName(System::pathOfArgument(name));
}

} // namespace

Finding inspectFile(const std::filesystem::path& file, LibraryImage& image) {
    if (const std::optional<Finding> finding = judgePlace(file))
        return *finding;
    image = readLibraryImage(file);
    Finding finding = judgeImage(image);
    // Files that the manager skips may have any name.
    if (severityOf(finding.verdict) != Severity::bystander && !isNameCarried(file))
        finding = {Verdict::nameNotCarried, {}, {}};
    return finding;
}

Verdict verdictOnAbsence(const std::filesystem::path& file) {
    std::error_code failure;
    const std::filesystem::file_status status = std::filesystem::status(file, failure);
    if (failure == std::errc::permission_denied)
        return Verdict::unreachable;
    return status.type() == std::filesystem::file_type::not_found ? Verdict::missing
                                                                  : Verdict::unreadable;
}

namespace {

/// Follows dependencies in the loader's order: breadth first, each name once.
class DependencyWalk {
  public:
    explicit DependencyWalk(const std::filesystem::path& folder) : programFolder(folder) {}

    std::vector<Dependency> from(const std::filesystem::path& file, const LibraryImage& image) {
        add({file, image, nullptr});
        for (std::size_t next = 0; next < loaded.size(); ++next)
            for (const std::string& name : loaded[next].image.needed)
                if (dependencies.size() < most && isNew(name, loaded[next]))
                    find(name, loaded[next]);
        return std::move(dependencies);
    }

  private:
    static constexpr std::size_t most = 2000;

    void add(System::Needer needer) {
        if (!needer.image.ownName.empty())
            byOwnName.emplace(needer.image.ownName, loaded.size());
        loaded.push_back(std::move(needer));
    }

    /// Returns whether the name was not searched yet. A name with a variable such as `$ORIGIN`
    /// names another file for each library, so it is searched for each.
    bool isNew(const std::string& name, const System::Needer& needer) {
        const bool variable = name.find('$') != std::string::npos;
        return seen.emplace(variable ? needer.library : std::filesystem::path(), name).second;
    }

    void find(const std::string& name, const System::Needer& needer) {
        const auto present = byOwnName.find(name);
        const System::Located located = present != byOwnName.end()
                                            ? System::Located{true, loaded[present->second].library}
                                            : System::findDependency(name, needer, programFolder);
        dependencies.push_back({toText(name), displayName(needer.library),
                                displayName(located.file),
                                located.found || needer.image.hasManifest});
        if (!located.file.empty() && present == byOwnName.end())
            add({located.file, readLibraryImage(located.file), &needer});
    }

    const std::filesystem::path& programFolder;
    std::vector<Dependency> dependencies;
    std::deque<System::Needer>
        loaded; ///< in the loader's order; a deque, because `Needer::loader` points into it
    std::map<std::string, std::size_t> byOwnName;
    std::set<std::pair<std::filesystem::path, std::string>> seen;
};

} // namespace

std::vector<Dependency> dependenciesOf(const std::filesystem::path& file, const LibraryImage& image,
                                       const std::filesystem::path& programFolder) {
    return DependencyWalk(programFolder).from(file, image);
}

std::optional<Finding> missingDependency(const std::filesystem::path& file,
                                         const std::vector<Dependency>& dependencies) {
    const std::wstring self = displayName(file);
    for (const Dependency& dependency : dependencies)
        if (!dependency.found)
            return Finding{Verdict::dependencyMissing, dependency.name,
                           dependency.neededBy == self
                               ? std::wstring()
                               : L" (it is needed by " + dependency.neededBy + L")"};
    return std::nullopt;
}

} // namespace Mz::Tools

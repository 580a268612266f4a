#include "components/componentTools/inspection.h"

#include "components/componentTools/platform/system.h"
#include "components/platform/platform.h"

#include <deque>
#include <set>

namespace Mz::Tools {

namespace {

std::optional<Finding> judgePlace(const std::filesystem::path& file) {
    const System::FileAttributes attributes = System::fileAttributes(file);
    if (attributes.directory)
        return Finding{Verdict::directory, {}, {}};
    const auto status = platform::queryFile(file.native());
    if (!status)
        return Finding{Verdict::missing, {}, {}};
    if (attributes.hidden)
        return Finding{Verdict::hidden, {}, {}};
    if (attributes.system)
        return Finding{Verdict::systemFile, {}, {}};
    if (!status->regular)
        return Finding{Verdict::notRegular, {}, {}};
    return std::nullopt;
}

bool isNameCarried(const std::filesystem::path& file) {
    const auto name = System::nameText(file);
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
    default: return {Verdict::component, {}, {}};
    }
}

std::wstring widened(const std::string& name) {
    return System::displayName(System::pathOfArgument(name));
}

} // namespace

Finding inspectFile(const std::filesystem::path& file, LibraryImage& image) {
    if (const std::optional<Finding> finding = judgePlace(file))
        return *finding;
    image = readLibraryImage(file);
    Finding finding = judgeImage(image);
    // The name of what is passed over anyway does not matter.
    if (severityOf(finding.verdict) != Severity::bystander && !isNameCarried(file))
        finding = {Verdict::nameNotCarried, {}, {}};
    return finding;
}

std::vector<Dependency> dependenciesOf(const std::filesystem::path& file, const LibraryImage& image,
                                       const std::filesystem::path& programFolder) {
    constexpr std::size_t most = 2000;
    std::vector<Dependency> dependencies;
    std::set<std::string> seen;
    std::deque<std::pair<std::filesystem::path, LibraryImage>> waiting{{file, image}};
    while (!waiting.empty() && dependencies.size() < most) {
        const auto [library, libraryImage] = std::move(waiting.front());
        waiting.pop_front();
        for (const std::string& name : libraryImage.needed) {
            if (!seen.insert(name).second)
                continue;
            const System::Located located =
                System::findDependency(name, library, libraryImage, programFolder);
            dependencies.push_back({widened(name), System::displayName(library),
                                    System::displayName(located.file),
                                    located.found || libraryImage.hasManifest});
            if (!located.file.empty())
                waiting.emplace_back(located.file, readLibraryImage(located.file));
        }
    }
    return dependencies;
}

std::optional<Finding> missingDependency(const std::filesystem::path& file,
                                         const std::vector<Dependency>& dependencies) {
    const std::wstring self = System::displayName(file);
    for (const Dependency& dependency : dependencies)
        if (!dependency.found)
            return Finding{Verdict::dependencyMissing, dependency.name,
                           dependency.neededBy == self
                               ? std::wstring()
                               : L" (it is needed by " + dependency.neededBy + L")"};
    return std::nullopt;
}

} // namespace Mz::Tools

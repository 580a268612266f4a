// SPDX-License-Identifier: BSL-1.0
/// Tests a set of components by a list in which all others are switched off: recorded without
/// builders, and marked so beside the list, in case that the host scans. The list is written anew
/// for each start, because hosts write their lists. Which sets are tested is decided by `minimise`.
#include "components/componentTools/bisect.h"

#include "components/componentManager/files.h"
#include "components/componentManager/listVariable.h"
#include "components/componentTools/bisecting/minimise.h"
#include "components/componentTools/bisecting/temporaryFolder.h"
#include "components/componentTools/inspecting/abiDifference.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/records/verdictsFile.h"

#include <limits>
#include <utility>

namespace Mz::Tools {

namespace {

/// Returns the file of the program: as a path, with the extension of programs, or in PATH.
std::filesystem::path programOf(const std::filesystem::path& host) {
    std::error_code ignored;
    for (const char* extension : {"", System::programExtension()}) {
        std::filesystem::path file = host;
        file += extension;
        if (std::filesystem::is_regular_file(file, ignored))
            return fullPath(file);
    }
    if (!host.has_parent_path())
        if (std::filesystem::path found = System::findProgram(host.string()); !found.empty())
            return found;
    return host;
}

std::wstring endingOf(const System::ChildResult& child) {
    using End = System::ChildResult::End;
    switch (child.end) {
    case End::exited: return L"exit status " + std::to_wstring(child.status);
    case End::crashed: return L"crash: " + child.detail;
    case End::timedOut: return L"still running at the time limit";
    default: return L"unknown end";
    }
}

class Bisection {
  public:
    explicit Bisection(const BisectOptions& wanted)
        : options(wanted), program(programOf(wanted.host)) {}

    BisectResult run() {
        ScanOptions scanning;
        scanning.folders = options.folders;
        scanning.list = options.list;
        scanning.probe = options.probe;
        scanning.controller = options.controller;
        result.stamp = ownStampText();
        result.scanned = scan(scanning);
        findComponents();
        if (result.scanned.interrupted)
            return std::move(result);
        const Minimum minimum = minimise(
            components.size(), [this](const Subset& active) { return fails(active); },
            options.repeat > 1);
        result.state = notStarted ? BisectResult::State::notStarted : stateOf(minimum.state);
        for (const std::size_t index : minimum.items)
            result.culprits.push_back(culprit(components[index]));
        return std::move(result);
    }

  private:
    struct Component {
        RecordedLibrary record;
        const ScannedFile* file;
        bool recorded; ///< false if a host loads it at each start
    };

    void findComponents() {
        for (const ScannedFile& file : result.scanned.files) {
            const RecordedLibraries& libraries =
                file.recorded ? result.scanned.libraries : result.scanned.unjudged;
            const RecordedLibrary* const record =
                findRecord(libraries, file.directory, file.fileName);
            if (record && (!file.recorded || !record->builders.empty()))
                components.push_back({*record, &file, file.recorded});
        }
        result.components = components.size();
    }

    /// Returns whether one of several starts with only these components fails.
    std::optional<bool> fails(const Subset& active) {
        for (int count = 0; count < options.repeat; ++count) {
            const std::optional<bool> failed = startFails(active);
            if (!failed || *failed)
                return failed;
        }
        return false;
    }

    std::optional<bool> startFails(const Subset& active) {
        if (isInterrupted()) // A host may end before it is polled.
            return std::nullopt;
        writeList(active);
        const System::ChildResult child = startHost();
        using End = System::ChildResult::End;
        if (child.end == End::interrupted)
            return std::nullopt;
        // Without its exit status, a host that works cannot be distinguished from one that fails.
        const bool endUnknown = child.end == End::unknown && !options.judge;
        if (child.end == End::notStarted || endUnknown) {
            notStarted = true;
            result.problem = endUnknown
                                 ? L"its exit status is not available. Do not ignore SIGCHLD "
                                   L"in the program that starts it"
                                 : child.detail;
            return std::nullopt;
        }
        HostStart start{++result.starts, active.size(), endingOf(child), isFailure(child)};
        if (options.judge) {
            const std::optional<bool> judged = options.judge(start);
            if (!judged)
                return std::nullopt;
            start.failed = *judged;
        }
        if (options.started)
            options.started(start);
        if (start.failed) {
            ++result.failures;
            result.ending = start.ending;
        }
        return start.failed;
    }

    bool isInterrupted() const {
        return (options.controller && options.controller->isInterrupted()) ||
               (options.probe.interrupted && options.probe.interrupted());
    }

    bool isFailure(const System::ChildResult& child) const {
        using End = System::ChildResult::End;
        return child.end == End::timedOut ? !options.runningIsGood
                                          : child.end != End::exited || child.status != 0;
    }

    /// Each start has a separate folder, so that a host finds no mark of an unclean end.
    void writeList(const Subset& active) const {
        std::filesystem::create_directory(hostList().parent_path());
        RecordedLibraries libraries = result.scanned.libraries;
        DisabledComponents disabled =
            options.list.empty() ? DisabledComponents() : disabledComponents(options.list);
        std::vector<bool> isActive(components.size());
        for (const std::size_t index : active)
            isActive[index] = true;
        for (std::size_t index = 0; index < components.size(); ++index) {
            const Component& component = components[index];
            if (isActive[index])
                continue;
            const DisabledComponent off{component.record.directory, component.record.fileName,
                                        L"for a search"};
            disabled.push_back(off);
            if (!component.recorded)
                libraries.push_back(component.record);
            for (RecordedLibrary& library : libraries)
                if (isRecordOf(library, off))
                    library.builders.clear();
        }
        writeRecordedList(hostList(), libraries);
        writeVerdicts(verdictsFileOf(hostList()), libraries, disabled);
    }

    System::ChildResult startHost() const {
        constexpr std::chrono::milliseconds never = std::chrono::hours(24 * 365);
        System::ChildLimits limits{options.timeLimit.count() > 0 ? options.timeLimit : never,
                                   std::numeric_limits<std::uint64_t>::max(), 0,
                                   std::numeric_limits<std::size_t>::max(),
                                   [this] { return isInterrupted(); }};
        limits.received = [this](std::string& output) {
            if (options.output)
                options.output(output);
            output.clear();
        };
        limits.environment.emplace_back(listVariable, hostList());
        return System::runChild(program, options.arguments, limits);
    }

    std::filesystem::path hostList() const {
        return folder.path() / std::to_string(result.starts) / "components.list";
    }

    static Culprit culprit(const Component& component) {
        const LibraryImage image = readLibraryImage(component.file->path);
        return {component.file->path, component.file->verdict,
                image.stamp ? textOf(*image.stamp) : std::wstring(), component.record};
    }

    static BisectResult::State stateOf(Minimum::State state) {
        switch (state) {
        case Minimum::State::found: return BisectResult::State::found;
        case Minimum::State::allPass: return BisectResult::State::allPass;
        case Minimum::State::noneFails: return BisectResult::State::noneFails;
        default: return BisectResult::State::stopped;
        }
    }

    const BisectOptions& options;
    const std::filesystem::path program;
    const TemporaryFolder folder;
    std::vector<Component> components;
    bool notStarted = false;
    BisectResult result;
};

} // namespace

BisectResult bisect(const BisectOptions& options) {
    return Bisection(options).run();
}

} // namespace Mz::Tools

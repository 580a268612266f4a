// SPDX-License-Identifier: BSL-1.0
/// A start that leaves out components passes the manager a list in which these have no builders.
/// The list in the file keeps them, so that the next start has them again. The mark is left after
/// the scan, which cannot harm this process, and before the manager is initialised.
#include "components/componentTools/start.h"

#include "components/componentManager/binaryStream.h"
#include "components/componentManager/bufferio.h"
#include "components/componentManager/componentImp.h"
#include "components/componentManager/files.h"
#include "components/componentManager/persistant.h"
#include "components/componentTools/starting/changes.h"
#include "components/componentTools/starting/startMark.h"
#include "components/platform/platform.h"

#include <algorithm>
#include <sstream>
#include <utility>

namespace Mz::Kit {

using namespace Tools;

struct Started::State {
    std::wstring problem;
    bool initialised = false;
    StartMode mode = StartMode::asAlways;
    std::optional<UncleanEnd> uncleanEnd;
    std::vector<std::filesystem::path> leftOut;
    ScanResult scanned;
    StartMark mark;

    ~State() { mark.remove(); }
};

Started::Started(std::unique_ptr<State> state) : state(std::move(state)) {}
Started::~Started() = default;
Started::Started(Started&&) noexcept = default;
Started& Started::operator=(Started&&) noexcept = default;

Started::operator bool() const {
    return state->initialised;
}

const std::wstring& Started::problem() const {
    return state->problem;
}

StartMode Started::mode() const {
    return state->mode;
}

const std::optional<UncleanEnd>& Started::uncleanEnd() const {
    return state->uncleanEnd;
}

const std::vector<std::filesystem::path>& Started::leftOut() const {
    return state->leftOut;
}

const ScanResult& Started::scanned() const {
    return state->scanned;
}

void Started::finish() {
    state->mark.remove();
}

namespace {

/// A component that a start may use, with what is known of it.
struct Present {
    std::filesystem::path path;
    RecordedLibrary record; ///< without builders if it could not be tried
    bool changed = false;
    bool own = false;
};

/// Returns whether the manager may load the file: it has builders, or could not be tried.
bool isUsed(const ScannedFile& file) {
    switch (file.verdict.verdict) {
    case Verdict::works:
    case Verdict::uidTaken:
    case Verdict::needsHost:
    case Verdict::textNotCarried:
    case Verdict::probeFailed: return !file.folder;
    default: return false;
    }
}

std::vector<Present> componentsOf(const ScanResult& scanned) {
    std::vector<Present> components;
    for (const ScannedFile& file : scanned.files) {
        if (!isUsed(file))
            continue;
        const RecordedLibrary* record =
            findRecord(scanned.libraries, file.directory, file.fileName);
        if (record) {
            components.push_back({file.path, *record});
        } else if (const auto status = platform::queryFile(file.path.native())) {
            components.push_back(
                {file.path, {file.directory, file.fileName, status->time, status->size, {}}});
        }
    }
    return components;
}

bool isBelow(const std::filesystem::path& folder, const std::filesystem::path& file) {
    std::error_code ignored;
    const auto plain = std::filesystem::weakly_canonical(file, ignored);
    const auto [end, rest] =
        std::mismatch(folder.begin(), folder.end(), plain.begin(), plain.end());
    return end == folder.end();
}

/// Returns the test for the host's own components.
std::function<bool(const std::filesystem::path&)> ownComponents(const StartOptions& options) {
    if (options.isOwn)
        return options.isOwn;
    return [folder = std::filesystem::weakly_canonical(programFolder())](
               const std::filesystem::path& file) { return isBelow(folder, file); };
}

bool isNamed(const ComponentName& name, const Present& component) {
    if (name.uid())
        return std::any_of(
            component.record.builders.begin(), component.record.builders.end(),
            [&](const RecordedBuilder& builder) { return builder.uid == *name.uid(); });
    const std::wstring wanted = platform::lowerCase(name.name());
    const std::wstring& fileName = component.record.fileName;
    return !wanted.empty() &&
           (fileName == wanted || fileName.substr(0, fileName.rfind(L'.')) == wanted);
}

/// Passes the records to the manager. Returns false if it is initialised already.
bool readIntoManager(const RecordedLibraries& libraries) {
    std::stringstream bytes;
    writeRecordedList(bytes, libraries);
    QrInBuffer buffer(&bytes);
    QrBinaryStream stream(&buffer);
    const auto companion =
        QrPtr<QrPersistant>::adopt(safeCast<QrPersistant>(QrGetComponentManager()));
    companion->read(stream);
    return buffer.tell() > 0;
}

} // namespace

/// One start, step by step.
class Starter {
  public:
    explicit Starter(const StartOptions& wanted)
        : options(wanted), state(std::make_unique<Started::State>()) {}

    Started run() {
        scanFolders();
        if (!state->scanned.interrupted) {
            findComponents();
            if (!options.list.empty())
                if (const auto orphaned = takeOrphanedMarks(options.list))
                    offerSafeMode(*orphaned);
            initialize();
        }
        return Started(std::move(state));
    }

  private:
    void scanFolders() {
        ScanOptions scanning;
        scanning.folders = folders = foldersOf(options.searchPath);
        scanning.list = options.list;
        scanning.probe = options.probe;
        scanning.controller = options.controller;
        state->scanned = scan(scanning);
        state->problem = state->scanned.notWritten;
        if (state->scanned.interrupted)
            state->problem = L"the start was interrupted, so no component is used";
    }

    void findComponents() {
        components = componentsOf(state->scanned);
        RecordedLibraries records;
        for (const Present& component : components)
            records.push_back(component.record);
        const LibraryNames changed =
            options.list.empty() ? LibraryNames() : changedLast(options.list, records);
        const auto isOwn = ownComponents(options);
        for (Present& component : components) {
            component.changed =
                changed.contains({component.record.directory, component.record.fileName});
            component.own = isOwn(component.path);
        }
    }

    void offerSafeMode(StartPhase phase) {
        UncleanEnd& end = state->uncleanEnd.emplace();
        end.whileStarting = phase == StartPhase::starting;
        for (const Present& component : components) {
            if (component.changed)
                end.changed.push_back(component.path);
            if (!component.own)
                end.thirdParty.push_back(component.path);
        }
        if (options.afterUncleanEnd)
            state->mode = options.afterUncleanEnd(end);
    }

    bool isLeftOut(const Present& component) const {
        return (state->mode == StartMode::withoutChanged && component.changed) ||
               (state->mode == StartMode::withoutThirdParty && !component.own) ||
               std::any_of(options.without.begin(), options.without.end(),
                           [&](const ComponentName& name) { return isNamed(name, component); });
    }

    /// Returns the records for the manager. One without builders keeps the manager from the file.
    RecordedLibraries recordsForManager() {
        RecordedLibraries records = state->scanned.libraries;
        for (const Present& component : components) {
            if (!isLeftOut(component))
                continue;
            state->leftOut.push_back(component.path);
            std::erase_if(records, [&](const RecordedLibrary& library) {
                return library.fileName == component.record.fileName &&
                       library.directory == component.record.directory;
            });
            records.push_back(component.record);
            records.back().builders.clear();
        }
        return records;
    }

    void initialize() {
        const std::wstring searchPath = searchPathOf(folders);
        if (searchPath.empty()) { // The manager would search the program's folder.
            state->problem = L"the search path names no folder that can be searched";
            return;
        }
        if (!readIntoManager(recordsForManager())) {
            state->problem = L"the component manager is initialised already";
            return;
        }
        if (!options.list.empty() && !state->mark.leave(options.list) && state->problem.empty())
            state->problem = displayName(options.list) +
                             L": no mark can be left beside this list, so the next start cannot "
                             L"tell whether this one ended cleanly";
        QrGetComponentManager()->initialize(searchPath.c_str());
        state->initialised = true;
        state->mark.startIsOver();
    }

    const StartOptions& options;
    std::unique_ptr<Started::State> state;
    std::vector<std::filesystem::path> folders;
    std::vector<Present> components;
};

Started start(const StartOptions& options) {
    return Starter(options).run();
}

Started start(const std::filesystem::path& list, const std::filesystem::path& searchPath) {
    StartOptions options;
    options.list = list;
    options.searchPath = searchPath;
    return start(options);
}

Started startWithout(std::vector<ComponentName> without, const std::filesystem::path& list,
                     const std::filesystem::path& searchPath) {
    StartOptions options;
    options.list = list;
    options.searchPath = searchPath;
    options.without = std::move(without);
    return start(options);
}

} // namespace Mz::Kit

// SPDX-License-Identifier: BSL-1.0
/// Goes through the candidates in the host's order. A record of the old list is reused if the file
/// is unchanged and a retry cannot help; otherwise the file is examined by `explainFile`. The list
/// is written at the end, in one step, so that an interrupted scan loses no old record.
#include "components/componentTools/scan.h"

#include "components/componentManager/exceptions.h"
#include "components/componentTools/explain.h"
#include "components/componentTools/inspecting/abiDifference.h"
#include "components/componentTools/inspecting/inspection.h"
#include "components/componentTools/inspecting/interfaceDifference.h"
#include "components/componentTools/inspecting/uidNotes.h"
#include "components/componentTools/reasonText.h"
#include "components/componentTools/records/verdictsFile.h"
#include "components/platform/platform.h"

#include <algorithm>
#include <map>

namespace Mz::Tools {

namespace {

using Name = std::pair<std::wstring, std::wstring>;

class Scanner {
  public:
    explicit Scanner(const ScanOptions& wanted) : options(wanted), probeOptions(wanted.probe) {
        probeOptions.interrupted = [this] { return isInterrupted(); };
    }

    ScanResult run() {
        readOld();
        const Discovery discovery = discover(options.folders);
        const std::size_t count = discovery.candidates.size();
        for (std::size_t index = 0; index < count; ++index) {
            result.interrupted = result.interrupted || isInterrupted();
            if (!result.interrupted)
                report(index, count, discovery.candidates[index]);
            add(discovery.candidates[index]);
        }
        compareUids();
        for (const Discovery::LeftOut& left : discovery.leftOut)
            leaveOut(left);
        if (!options.list.empty())
            write();
        return std::move(result);
    }

  private:
    bool isInterrupted() const {
        return (options.controller && options.controller->isInterrupted()) ||
               (options.probe.interrupted && options.probe.interrupted());
    }

    void report(std::size_t index, std::size_t count, const Candidate& candidate) const {
        if (options.controller && options.controller->isProgressShown())
            options.controller->progress(static_cast<float>(index) / static_cast<float>(count),
                                         displayName(candidate.path.filename()).c_str());
    }

    void readOld() {
        if (options.list.empty())
            return;
        readDisabledNames();
        ListReading reading = readRecordedList(options.list);
        result.rejected = reading.reason;
        for (RecordedLibrary& library : reading.libraries) {
            Name name(library.directory, library.fileName);
            old.emplace(std::move(name), std::move(library));
        }
    }

    void write() {
        std::error_code failure;
        if (std::filesystem::is_directory(options.list, failure))
            keepFromWriting(L"nothing was written, for this is a folder");
        else if (unprobed > 0 && probed == 0)
            keepFromWriting(L"nothing was written, for no library could be tried");
        else if (!result.rejected.empty() && !keepRejected())
            keepFromWriting(L"nothing was written, for what is there could not be kept");
        if (!result.notWritten.empty())
            return;
        dropNewlyDisabled();
        writeGuarded([&] { writeRecordedList(options.list, result.libraries); });
        // The list comes first: without verdicts it is still valid, and the next scan only retries
        // more. Verdicts without their list are useless.
        if (result.notWritten.empty())
            writeGuarded(
                [&] { writeVerdicts(verdictsFileOf(options.list), result.libraries, disabled); });
    }

    /// Reads what is switched off. A file that is not valid is treated as in `readVerdicts`.
    void readDisabledNames() {
        disabled = readDisabled(verdictsFileOf(options.list)).value_or(DisabledComponents());
    }

    const DisabledComponent* findDisabled(const Candidate& candidate) const {
        const auto found =
            std::find_if(disabled.begin(), disabled.end(), [&](const DisabledComponent& component) {
                return component.fileName == candidate.fileName &&
                       component.directory == candidate.directory;
            });
        return found == disabled.end() ? nullptr : &*found;
    }

    /// The user may have switched off a component during the scan.
    void dropNewlyDisabled() {
        readDisabledNames();
        for (const DisabledComponent& component : disabled)
            for (RecordedLibrary& library : result.libraries)
                if (isRecordOf(library, component)) {
                    library.builders.clear();
                    library.kept = disabledFinding(component);
                }
    }

    template <class Write>
    void writeGuarded(Write write) {
        try {
            write();
        } catch (const QrStreamEx& failure) {
            result.notWritten = reasonText(failure.getReason());
        }
    }

    void keepFromWriting(const wchar_t* why) {
        result.notWritten = displayName(options.list) + L": " + why;
    }

    /// Saves a copy of the rejected file. The user may have named a valuable file by mistake.
    /// \return false if the copy failed
    bool keepRejected() {
        std::error_code failure;
        if (std::filesystem::is_empty(options.list, failure) && !failure)
            return true;
        std::filesystem::path copy = options.list;
        copy += ".rejected";
        std::filesystem::copy_file(options.list, copy,
                                   std::filesystem::copy_options::overwrite_existing, failure);
        if (!failure)
            result.keptAs = copy;
        return !failure;
    }

    void add(const Candidate& candidate) {
        ScannedFile file{candidate.path, candidate.directory, candidate.fileName, {}, {}};
        const auto status = platform::queryFile(candidate.path.native());
        const Name name(candidate.directory, candidate.fileName);
        const auto known = old.find(name);
        const bool unchanged = known != old.end() && status && status->time == known->second.time &&
                               status->size == known->second.size;
        if (!status) {
            file.verdict.verdict =
                verdictOnAbsence(candidate.path); // Gone since the folder was listed.
        } else if (const DisabledComponent* const component = findDisabled(candidate)) {
            file.verdict = disabledFinding(*component);
            recordWithoutBuilders(file, *status);
        } else if (unchanged && !isTriedAgain(known->second) &&
                   !isForOtherHost(candidate, known->second)) {
            file.verdict = verdictOf(known->second);
            keep(file, known->second);
        } else if (result.interrupted) {
            file.verdict.verdict = Verdict::interrupted;
        } else {
            look(file, *status);
        }
        // A library that could not be tried keeps its old record.
        if (known != old.end() && (file.verdict.verdict == Verdict::interrupted ||
                                   (unchanged && file.verdict.verdict == Verdict::probeFailed)))
            keep(file, known->second);
        result.files.push_back(std::move(file));
    }

    /// Returns whether a library that worked earlier does not match: its stamp, or its interfaces.
    /// The library does not change when libMZcomponentManager or the host is replaced.
    bool isForOtherHost(const Candidate& candidate, const RecordedLibrary& library) const {
        return !library.builders.empty() &&
               (abiDifference(readLibraryImage(candidate.path)).has_value() ||
                interfaceDifference(candidate.path, options.hosts).has_value());
    }

    /// Returns whether an unchanged library may have another result now.
    bool isTriedAgain(const RecordedLibrary& library) const {
        if (!library.builders.empty())
            return false;
        if (!library.kept) // Recorded by a host, or the verdicts were lost.
            return true;
        switch (library.kept->verdict) {
        case Verdict::dependencyMissing: // It does not change when its dependency arrives.
        case Verdict::loadFailed:        // Nor when the dependency of a dependency does.
        case Verdict::otherAbi:          // Nor when this library does.
        case Verdict::otherInterface:    // Nor when its host does.
        case Verdict::unreadable:
        case Verdict::probeFailed:
        case Verdict::endUnknown:
        case Verdict::interrupted: return true;
        default: return options.retry && severityOf(library.kept->verdict) == Severity::fault;
        }
    }

    static Finding verdictOf(const RecordedLibrary& library) {
        if (!library.builders.empty())
            return {Verdict::works, std::to_wstring(library.builders.size()), {}};
        return library.kept.value_or(Finding{Verdict::recordedFailed, {}, {}});
    }

    /// Copies a record of the old list.
    void keep(ScannedFile& file, const RecordedLibrary& library) {
        file.recorded = true;
        result.libraries.push_back(library);
    }

    /// Records a library that no host is to load.
    void recordWithoutBuilders(ScannedFile& file, const platform::FileStatus& status) {
        RecordedLibrary library{file.directory, file.fileName, status.time, status.size, {}};
        library.kept = file.verdict;
        file.recorded = true;
        result.libraries.push_back(std::move(library));
    }

    void look(ScannedFile& file, const platform::FileStatus& status) {
        ExplainOptions explaining;
        explaining.load = true;
        explaining.hosts = options.hosts;
        explaining.probe = probeOptions;
        Explanation explanation = explainFile(file.path, explaining);
        file.looked = true;
        file.verdict = std::move(explanation.verdict);
        file.notes = std::move(explanation.notes);
        if (file.verdict.verdict == Verdict::interrupted) {
            result.interrupted = true;
            return;
        }
        if (file.verdict.verdict == Verdict::probeFailed) {
            ++unprobed; // Not a fault of the library.
            return;
        }
        ++probed;
        RecordedLibrary library;
        library.directory = file.directory;
        library.fileName = file.fileName;
        library.time = status.time;
        library.size = status.size;
        if (file.verdict.verdict == Verdict::needsHost) {
            result.unjudged.push_back(std::move(library)); // Only the host can load it.
            return;
        }
        if (file.verdict.verdict == Verdict::works)
            library.builders = std::move(explanation.builders);
        if (const std::wstring* text = uncarriedText(library)) {
            // A record without builders would keep hosts from loading it, though it works.
            file.verdict = {Verdict::textNotCarried, *text, {}};
            return;
        }
        if (library.builders.empty())
            library.kept = file.verdict;
        file.recorded = true;
        result.libraries.push_back(std::move(library));
    }

    /// Adds notes on uids that several recorded libraries have. A library that loses a builder is
    /// recorded nevertheless, because hosts register it too.
    void compareUids() {
        const UidNotes uids(result.libraries);
        std::size_t position = 0;
        for (ScannedFile& file : result.files) {
            if (!file.recorded)
                continue;
            for (Finding& note : uids.notesOn(result.libraries[position].builders, position)) {
                const bool first = file.verdict.verdict == Verdict::works;
                if (first && note.verdict == Verdict::uidTaken)
                    file.verdict = note;
                // `explainFile` may have added the same note.
                if (std::find(file.notes.begin(), file.notes.end(), note) == file.notes.end())
                    file.notes.push_back(std::move(note));
            }
            ++position;
        }
    }

    static const std::wstring* uncarriedText(const RecordedLibrary& library) {
        for (const RecordedBuilder& builder : library.builders)
            for (const std::wstring* text : {&builder.name, &builder.label, &builder.text})
                if (!isCarried(*text))
                    return text;
        return nullptr;
    }

    void leaveOut(const Discovery::LeftOut& left) {
        ScannedFile file{left.path, {}, {}, left.finding, {}};
        file.looked = true;
        file.folder = left.folder;
        result.files.push_back(std::move(file));
    }

    const ScanOptions& options;
    ProbeOptions probeOptions;
    std::map<Name, RecordedLibrary> old;
    DisabledComponents disabled;
    ScanResult result;
    int probed = 0, unprobed = 0; ///< libraries that were tried, and that could not be tried
};

} // namespace

ScanResult scan(const ScanOptions& options) {
    return Scanner(options).run();
}

} // namespace Mz::Tools

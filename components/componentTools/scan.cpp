// SPDX-License-Identifier: BSL-1.0
/// Goes through the candidates in the host's order. A record of the old list is reused if the file
/// is unchanged and a retry cannot help; otherwise the file is examined by `explainFile`. With
/// several jobs, other threads examine, and this one takes their outcomes in the host's order: so
/// everything that depends on the order, and every callback, is as with one. The list is written at
/// the end, in one step, so that an interrupted scan loses no old record.
#include "components/componentTools/scan.h"

#include "components/componentManager/exceptions.h"
#include "components/componentTools/inspecting/abiDifference.h"
#include "components/componentTools/inspecting/explaining.h"
#include "components/componentTools/inspecting/inspection.h"
#include "components/componentTools/inspecting/uidNotes.h"
#include "components/componentTools/reasonText.h"
#include "components/componentTools/records/verdictsFile.h"
#include "components/componentTools/scanning/judgement.h"
#include "components/componentTools/scanning/orderedWork.h"
#include "components/platform/platform.h"

#include <algorithm>
#include <cstddef>
#include <map>
#include <optional>
#include <thread>
#include <utility>

namespace Mz::Tools {

namespace {

using Name = std::pair<std::wstring, std::wstring>;

/// The largest number of threads, far above that of processors which a scan can use.
constexpr std::size_t mostJobs = 256;

/// What was found out about one candidate.
struct Outcome {
    enum class Step { absent, disabled, reused, leftForLater, examined };
    Step step = Step::absent;
    std::optional<platform::FileStatus> status;
    const RecordedLibrary* known = nullptr; ///< its old record
    bool unchanged = false;                 ///< whether that has the file's time and size
    Finding verdict;
    std::vector<Finding> notes;
    std::vector<RecordedBuilder> builders;
};

class Scanner {
  public:
    explicit Scanner(const ScanOptions& wanted) : options(wanted), host(wanted.hosts) {}

    ScanResult run() {
        readOld();
        const Discovery discovery = discover(options.folders);
        addAll(discovery.candidates);
        compareUids();
        for (const Discovery::LeftOut& left : discovery.leftOut)
            leaveOut(left);
        if (std::any_of(discovery.leftOut.begin(), discovery.leftOut.end(), isUnreadFolder))
            keepUnlisted(discovery.candidates);
        if (!options.list.empty())
            write();
        return std::move(result);
    }

  private:
    static bool isUnreadFolder(const Discovery::LeftOut& left) {
        return left.folder && left.finding.verdict == Verdict::unreadable;
    }

    /// Keeps the old records without a candidate: their files may exist nevertheless.
    void keepUnlisted(const std::vector<Candidate>& candidates) {
        for (const Candidate& candidate : candidates)
            old.erase(Name(candidate.directory, candidate.fileName));
        for (const auto& [name, library] : old)
            result.libraries.push_back(library);
        allJudged = false;
    }

    bool isInterrupted() const {
        return (options.controller && options.controller->isInterrupted()) ||
               (options.probe.interrupted && options.probe.interrupted());
    }

    std::size_t jobs() const {
        const std::size_t processors = std::max(1u, std::thread::hardware_concurrency());
        return std::min(options.jobs ? options.jobs : processors, mostJobs);
    }

    void addAll(const std::vector<Candidate>& candidates) {
        const std::size_t count = candidates.size();
        std::vector<Outcome> outcomes(count);
        // Threads that start processes change the error mode of the whole process, and restore the
        // one that they find. It must be the same for all of them.
        const platform::QuietErrors quiet;
        OrderedWork all(count, jobs(), [&](std::size_t index, const OrderedWork& work) {
            outcomes[index] = examine(candidates[index], work);
        });
        for (std::size_t index = 0; index < count; ++index) {
            stopIfInterrupted(all);
            if (!result.interrupted)
                report(index, count, candidates[index]);
            all.wait(index, [&] { stopIfInterrupted(all); });
            add(candidates[index], std::move(outcomes[index]));
        }
    }

    void stopIfInterrupted(OrderedWork& work) {
        result.interrupted = result.interrupted || isInterrupted();
        if (result.interrupted)
            work.stop();
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
        const std::string judgement = readJudgement(verdictsFileOf(options.list));
        ownJudgement = judgementOf({}, options.hosts);
        judged = !judgement.empty() && judgement == judgementOf(reading.libraries, options.hosts);
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
        if (result.notWritten.empty())
            dropNewlyDisabled();
        if (!result.notWritten.empty())
            return;
        writeGuarded([&] { writeRecordedList(options.list, result.libraries); });
        // The list comes first: without verdicts it is still valid, and the next scan only retries
        // more. Verdicts without their list are useless.
        if (result.notWritten.empty())
            writeGuarded([&] {
                writeVerdicts(verdictsFileOf(options.list), result.libraries, disabled,
                              newJudgement());
            });
    }

    /// Returns the digest of this scan; empty if the next scan must compare again.
    std::string newJudgement() const {
        const bool sameHost = judgementOf({}, options.hosts) == ownJudgement;
        return allJudged && sameHost ? judgementOf(result.libraries, options.hosts) : "";
    }

    /// Reads what is switched off. A file that is not valid is treated as in `readVerdicts`.
    void readDisabledNames() {
        bool unreadable = false;
        const std::filesystem::path file = verdictsFileOf(options.list);
        disabled = readDisabled(file, &unreadable).value_or(DisabledComponents());
        if (unreadable) // Writing it anew would switch everything on.
            result.notWritten =
                displayName(file) + L": nothing was written, for this file could not be read";
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

    /// Finds out what to do with a candidate, and examines it if that is necessary. Several threads
    /// may call it at once, which call nothing of the caller.
    Outcome examine(const Candidate& candidate, const OrderedWork& work) const {
        Outcome outcome;
        outcome.status = platform::queryFile(candidate.path.native());
        const auto known = old.find(Name(candidate.directory, candidate.fileName));
        if (known != old.end())
            outcome.known = &known->second;
        outcome.unchanged = outcome.known && outcome.status &&
                            outcome.status->time == outcome.known->time &&
                            outcome.status->size == outcome.known->size;
        if (!outcome.status) {
            outcome.verdict.verdict =
                verdictOnAbsence(candidate.path); // Gone since the folder was listed.
        } else if (const DisabledComponent* const component = findDisabled(candidate)) {
            outcome.step = Outcome::Step::disabled;
            outcome.verdict = disabledFinding(*component);
        } else if (outcome.unchanged && !isTriedAgain(*outcome.known) &&
                   !isForOtherHost(candidate, *outcome.known)) {
            outcome.step = Outcome::Step::reused;
            outcome.verdict = verdictOf(*outcome.known);
        } else if (work.isStopped()) {
            outcome.step = Outcome::Step::leftForLater;
            outcome.verdict.verdict = Verdict::interrupted;
        } else {
            explain(candidate, work, outcome);
        }
        return outcome;
    }

    void explain(const Candidate& candidate, const OrderedWork& work, Outcome& outcome) const {
        ExplainOptions explaining;
        explaining.load = true;
        explaining.probe = options.probe;
        if (work.hasThreads())
            explaining.probe.interrupted = [&work] { return work.isStopped(); };
        else
            explaining.probe.interrupted = [this] { return isInterrupted(); };
        Explanation explanation = explainFile(candidate.path, explaining, host);
        outcome.step = Outcome::Step::examined;
        outcome.verdict = std::move(explanation.verdict);
        outcome.notes = std::move(explanation.notes);
        outcome.builders = std::move(explanation.builders);
    }

    void add(const Candidate& candidate, Outcome outcome) {
        ScannedFile file{candidate.path, candidate.directory, candidate.fileName,
                         std::move(outcome.verdict), std::move(outcome.notes)};
        const bool unchanged = outcome.unchanged || outcome.step == Outcome::Step::absent;
        const bool isUnread =
            outcome.known && unchanged && file.verdict.verdict == Verdict::unreadable;
        switch (outcome.step) {
        case Outcome::Step::disabled: recordWithoutBuilders(file, *outcome.status); break;
        case Outcome::Step::reused: keep(file, *outcome.known); break;
        case Outcome::Step::examined:
            file.looked = true;
            if (!isUnread)
                record(file, *outcome.status, std::move(outcome.builders));
            break;
        case Outcome::Step::absent:
        case Outcome::Step::leftForLater: break;
        }
        // A library that could not be read or tried keeps its old record.
        if (outcome.known &&
            (file.verdict.verdict == Verdict::interrupted || isUnread ||
             (outcome.unchanged && file.verdict.verdict == Verdict::probeFailed))) {
            keep(file, *outcome.known);
            allJudged = false;
        }
        result.files.push_back(std::move(file));
    }

    /// Returns whether a library that worked earlier does not match: its stamp, or its interfaces.
    /// The library does not change when libMZcomponentManager or the host is replaced.
    bool isForOtherHost(const Candidate& candidate, const RecordedLibrary& library) const {
        if (library.builders.empty() || judged)
            return false;
        FileBytes file(candidate.path);
        return abiDifference(readLibraryImage(file)).has_value() ||
               host.difference(file).has_value();
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

    /// Records what the examination of a library found.
    void record(ScannedFile& file, const platform::FileStatus& status,
                std::vector<RecordedBuilder> builders) {
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
            library.builders = std::move(builders);
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
    const HostInterfaces host;
    std::string ownJudgement; ///< of this host, with no libraries, before the first comparison
    bool judged = false;      ///< whether the old list was compared with this host
    bool allJudged = true;    ///< whether the new list is
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

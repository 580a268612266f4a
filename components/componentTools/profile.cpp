// SPDX-License-Identifier: BSL-1.0
/// Runs the two kinds of processes in turn, so that a change of the machine's speed meets both. The
/// first turn fills the file cache, and finds the libraries that end their process; each of them is
/// excluded, and the measurement begins again. The medians of the runs are the result.
#include "components/componentTools/profile.h"

#include "components/componentTools/explain.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/probing/probeProcess.h"
#include "components/componentTools/profiling/profileChild.h"
#include "components/componentTools/profiling/profileMessages.h"
#include "components/componentTools/profiling/startFiles.h"

#include <algorithm>
#include <map>
#include <set>
#include <utility>

namespace Mz::Tools {

namespace {

using std::chrono::nanoseconds;

/// The largest number of libraries that are excluded. A path with more of them needs a scan.
constexpr std::size_t mostExcluded = 100;

/// Returns the median; for an even number of values, the mean of the middle two.
nanoseconds medianOf(std::vector<nanoseconds> values) {
    if (values.empty())
        return nanoseconds(0);
    std::sort(values.begin(), values.end());
    const std::size_t middle = values.size() / 2;
    return values.size() % 2 ? values[middle] : (values[middle - 1] + values[middle]) / 2;
}

/// The measurement of one start.
class Profiler {
  public:
    explicit Profiler(const ProfileOptions& wanted) : options(wanted) {}

    StartProfile run() {
        for (Discovery::LeftOut& left : discover(options.folders).leftOut)
            if (left.folder)
                result.leftOut.push_back(std::move(left));
        readList();
        // For an empty path the manager would search the program's folder.
        const std::wstring searchPath = searchPathOf(options.folders);
        if (!searchPath.empty()) {
            files = listStartFiles(searchPath);
            while (!measure())
                clearSamples();
        }
        takeMedians();
        return std::move(result);
    }

  private:
    void readList() {
        if (options.list.empty())
            return;
        ListReading reading = readRecordedList(options.list);
        if (reading.state == ListReading::State::good)
            list = std::filesystem::absolute(options.list);
        else
            result.listProblem = displayName(options.list) +
                                 (reading.state == ListReading::State::missing
                                      ? L": there is no such list. Make it with \"scan --cache\""
                                      : L": no recorded list: " + reading.reason);
        recorded = std::move(reading.libraries);
    }

    void clearSamples() {
        times.clear();
        listings.clear();
        others.clear();
        readings.clear();
        wholes.clear();
        result.runs = 0;
    }

    /// Measures all runs. Returns false if they must be repeated without one more library.
    bool measure() {
        for (int run = 0; run <= std::max(options.runs, 1); ++run) {
            if (run == 1)
                clearSamples();
            if (interrupted())
                return true;
            if (!measureSteps())
                return over;
            measureWhole();
            if (over)
                return true;
            result.runs += run > 0;
        }
        return true;
    }

    /// Called before each run, because a short process can end before the option is asked.
    bool interrupted() {
        const auto& asked = options.process.interrupted;
        if (!asked || !asked())
            return false;
        result.interrupted = over = true;
        return true;
    }

    System::ChildResult runProcess(bool whole, std::chrono::milliseconds timeLimit) const {
        const ProbeOptions& process = options.process;
        const std::uint64_t refused = refusedMemory(process);
        System::ChildLimits limits{timeLimit, process.memoryLimit, refused, longestAnswer,
                                   process.interrupted};
        limits.outputRestartsTime = true;
        std::vector<std::filesystem::path> arguments{
            profileArgument, std::to_string(refused),
            encodeTask(ProfileTask{whole, files.size(), excluded}), list};
        arguments.insert(arguments.end(), options.folders.begin(), options.folders.end());
        return System::runChild(probeProgram(process), arguments, limits);
    }

    /// Returns whether the process of the steps reached its end. If not, either a library was
    /// excluded, or the measurement is over.
    bool measureSteps() {
        const System::ChildResult child = runProcess(false, options.process.timeLimit);
        const ProfileReport report = decodeProfileReport(child.output, files.size());
        if (stopped(child, report))
            return false;
        if (!report.done || report.garbled) {
            exclude(child, report);
            return false;
        }
        for (const LibrarySteps& steps : report.libraries) {
            times[steps.index].push_back(steps.times);
            verdicts[steps.index] = steps.verdict;
        }
        listings.push_back(report.listing);
        others.push_back(report.otherTime);
        result.otherFiles = report.otherFiles - excluded.size();
        return true;
    }

    /// Notes why the measurement cannot go on, whatever the libraries do.
    bool stopped(const System::ChildResult& child, const ProfileReport& report) {
        using End = System::ChildResult::End;
        if (child.end == End::interrupted)
            result.interrupted = true;
        else if (child.end == End::notStarted)
            result.problem =
                L"the process of the measurement could not be started: " + child.detail;
        else if (report.otherFolders)
            result.problem = L"the folders changed during the measurement. Repeat it";
        else
            return false;
        over = true;
        return true;
    }

    static ProbeAnswer answerOfReport(const ProfileReport& report) {
        ProbeAnswer answer;
        answer.anything = true;
        answer.stage = report.stage;
        answer.garbled = report.garbled;
        answer.fault = report.fault;
        return answer;
    }

    void exclude(const System::ChildResult& child, const ProfileReport& report) {
        const Finding finding = judgeEnd(child, answerOfReport(report), options.process);
        over = !report.current || excluded.size() >= mostExcluded;
        if (over) {
            result.problem = L"the process of the measurement ended early: " + sentenceOf(finding);
        } else {
            excluded.insert(*report.current);
            verdicts[*report.current] = finding;
        }
    }

    /// Measures `initialize`. A library that only ends the process of the manager has no name here.
    void measureWhole() {
        // The process sends nothing meanwhile, so its limit covers all libraries.
        nanoseconds expected(0);
        for (const auto& [index, samples] : times)
            for (const nanoseconds time : samples.back())
                expected += time;
        const System::ChildResult child = runProcess(
            true, options.process.timeLimit +
                      10 * std::chrono::duration_cast<std::chrono::milliseconds>(expected));
        const ProfileReport report = decodeProfileReport(child.output, files.size());
        if (stopped(child, report))
            return;
        if (report.done && !report.garbled) {
            wholes.push_back(report.initialize);
            if (report.listReading)
                readings.push_back(*report.listReading);
            return;
        }
        over = true;
        result.problem = L"initialize could not be measured: " +
                         sentenceOf(judgeEnd(child, answerOfReport(report), options.process));
    }

    void takeMedians() {
        result.listing = medianOf(listings);
        result.otherTime = medianOf(others);
        if (!readings.empty())
            result.listReading = medianOf(readings);
        if (!wholes.empty())
            result.initialize = medianOf(wholes);
        for (const auto& [index, verdict] : verdicts)
            result.libraries.push_back(libraryAt(index, verdict));
        std::stable_sort(result.libraries.begin(), result.libraries.end(),
                         [](const ProfiledLibrary& a, const ProfiledLibrary& b) {
                             return std::pair(a.measured, a.total()) >
                                    std::pair(b.measured, b.total());
                         });
    }

    ProfiledLibrary libraryAt(std::size_t index, const Finding& verdict) {
        ProfiledLibrary library;
        library.path = files[index].found;
        library.verdict = verdict;
        library.loaded = verdict.verdict != Verdict::recordedUnchanged;
        library.measured = !excluded.contains(index);
        if (!result.interrupted)
            library.verdict = explained(library, verdict);
        if (!list.empty())
            library.record = library.loaded ? whyLoaded(library.path) : verdict;
        for (std::size_t phase = 0; phase < startPhaseCount; ++phase) {
            std::vector<nanoseconds> samples;
            for (const PhaseTimes& sample : times[index])
                samples.push_back(sample[phase]);
            library.times[phase] = medianOf(std::move(samples));
        }
        return library;
    }

    /// Returns the verdict of a scan, where it explains more than what this process has seen: why
    /// the system does not load the library, or that a library that crashes is for another ABI.
    Finding explained(const ProfiledLibrary& library, const Finding& seen) const {
        const bool loadFailed = seen.verdict == Verdict::loadFailed;
        if (library.measured && !loadFailed)
            return seen;
        ExplainOptions explaining;
        explaining.load = loadFailed;
        explaining.probe = options.process;
        Finding finding = explainFile(library.path, explaining).verdict;
        if (severityOf(finding.verdict) == Severity::fault)
            return finding;
        if (!loadFailed)
            return seen;
        return {seen.verdict, {}, L"it loads alone, but not after the libraries before it"};
    }

    Finding whyLoaded(const std::filesystem::path& path) const {
        ExplainOptions explaining;
        explaining.followDependencies = false;
        explaining.recorded = &recorded;
        return explainFile(path, explaining).notes.front();
    }

    const ProfileOptions& options;
    std::filesystem::path list; ///< empty if it is not used
    RecordedLibraries recorded;
    std::vector<StartFile> files;
    std::set<std::size_t> excluded;
    bool over = false;

    std::map<std::size_t, std::vector<PhaseTimes>> times; ///< by the index of the candidate
    std::map<std::size_t, Finding> verdicts;
    std::vector<nanoseconds> listings, others, readings, wholes;
    StartProfile result;
};

} // namespace

StartProfile profileStart(const ProfileOptions& options) {
    return Profiler(options).run();
}

} // namespace Mz::Tools

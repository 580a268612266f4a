// SPDX-License-Identifier: BSL-1.0
/// The commands that examine files: list, explain, scan. They load no library into this process, so
/// they need no `Host`.
#include "components/componentTools/consoleText.h"
#include "components/componentTools/uidText.h"
#include "tools/mzcomponents/commands.h"
#include "tools/mzcomponents/output.h"

#include "components/componentTools/discovery.h"

#include <algorithm>
#include <ostream>

namespace Mz::Commands {

namespace {

constexpr std::size_t nameWidth = 20;

/// The list from the command line. A missing or rejected list is reported and counts as empty.
struct Recorded {
    explicit Recorded(const Common& common) {
        if (common.cache.empty())
            return;
        Tools::ListReading reading = Tools::readRecordedList(Tools::pathOf(common.cache));
        wanted = true;
        sound = reading.state == Tools::ListReading::State::good;
        if (!sound)
            printError(toWide(common.cache) + (reading.state == Tools::ListReading::State::missing
                                                   ? L": there is no such list"
                                                   : L": no recorded list: " + reading.reason));
        libraries = std::move(reading.libraries);
    }

    const Tools::RecordedLibraries* get() const { return wanted ? &libraries : nullptr; }

    bool wanted = false, sound = true;
    Tools::RecordedLibraries libraries;
};

void printSentence(const Tools::Finding& finding) {
    printLine(std::wstring(nameWidth + 2, L' ') + Tools::sentenceOf(finding));
}

/// Returns the verdict; for a component that loses a builder to another library, `uidTaken`.
Tools::Finding withUidTaken(const Tools::Explanation& explanation) {
    if (explanation.verdict.verdict == Tools::Verdict::component)
        for (const Tools::Finding& note : explanation.notes)
            if (note.verdict == Tools::Verdict::uidTaken)
                return note;
    return explanation.verdict;
}

void printFile(const std::filesystem::path& file, const Tools::Finding& finding,
               const std::vector<Tools::Finding>& notes) {
    std::wstring line = padded(nameOf(finding), nameWidth) + L"  " + Tools::displayName(file);
    for (const Tools::Finding& note : notes)
        if (!(note == finding))
            line += L"  " + nameOf(note);
    printLine(line);
    if (finding.verdict == Tools::Verdict::uidTaken ||
        finding.verdict == Tools::Verdict::disabledByUser)
        printSentence(finding);
}

Json jsonOfFile(const std::filesystem::path& file, const Tools::Finding& finding,
                const std::vector<Tools::Finding>& notes) {
    Json entry{{"file", utf8(Tools::displayName(file))}};
    entry.update(jsonOf(finding));
    entry["notes"] = Json::array();
    for (const Tools::Finding& note : notes)
        entry["notes"].push_back(jsonOf(note));
    return entry;
}

void printExplanation(const Tools::Explanation& explanation) {
    printLine(Tools::displayName(explanation.file) + L": " + nameOf(explanation.verdict));
    const auto tell = [](const Tools::Finding& finding) {
        printLine(L"  " + Tools::sentenceOf(finding));
        if (const std::wstring cure = Tools::cureOf(finding); !cure.empty())
            printLine(L"    cure: " + cure);
    };
    tell(explanation.verdict);
    for (const Tools::Finding& note : explanation.notes)
        tell(note);
    if (!explanation.label.empty() || !explanation.text.empty())
        printLine(L"  description: " + explanation.label + L"; " + explanation.text);
    for (const Tools::RecordedBuilder& builder : explanation.builders)
        printLine(L"  builder " + Tools::textOf(builder.uid) + L"  " + builder.name + L"  " +
                  builder.label);
    for (const Tools::Dependency& dependency : explanation.dependencies)
        printLine(L"  needs " + dependency.name + L": " +
                  (!dependency.found         ? L"not found"
                   : dependency.path.empty() ? L"known to the system"
                                             : dependency.path));
}

Json jsonOfExplanation(const Tools::Explanation& explanation) {
    Json entry = jsonOfFile(explanation.file, explanation.verdict, explanation.notes);
    entry["label"] = utf8(explanation.label);
    entry["text"] = utf8(explanation.text);
    entry["builders"] = Json::array();
    for (const Tools::RecordedBuilder& builder : explanation.builders)
        entry["builders"].push_back(jsonOf(builder));
    entry["dependencies"] = Json::array();
    for (const Tools::Dependency& dependency : explanation.dependencies)
        entry["dependencies"].push_back({{"name", utf8(dependency.name)},
                                         {"found", dependency.found},
                                         {"path", utf8(dependency.path)},
                                         {"neededBy", utf8(dependency.neededBy)}});
    return entry;
}

/// Returns whether reading the file shows no fault, but its record has no builders.
bool failedEarlier(const Tools::Explanation& explanation) {
    return explanation.verdict.verdict == Tools::Verdict::component && !explanation.notes.empty() &&
           explanation.notes.front().verdict == Tools::Verdict::recordedFailed;
}

/// Returns whether the user switched the component off.
bool isDisabled(const Tools::Explanation& explanation) {
    return std::any_of(
        explanation.notes.begin(), explanation.notes.end(),
        [](const Tools::Finding& note) { return note.verdict == Tools::Verdict::disabledByUser; });
}

/// Returns whether the search path does not lead to the file.
bool isPassedBy(const Tools::Explanation& explanation) {
    return std::any_of(
        explanation.notes.begin(), explanation.notes.end(),
        [](const Tools::Finding& note) { return note.verdict == Tools::Verdict::notOnPath; });
}

void printSummary(const Tools::ScanResult& result) {
    std::size_t works = 0, faults = 0, looked = 0;
    for (const Tools::ScannedFile& file : result.files) {
        works += file.verdict.verdict == Tools::Verdict::works ||
                 file.verdict.verdict == Tools::Verdict::uidTaken;
        faults += isFault(file.verdict);
        looked += file.looked;
    }
    const std::size_t others = result.files.size() - works - faults;
    printLine(counted(result.files.size(), L"file", L"files") + L": " + std::to_wstring(works) +
              L" with builders, " + std::to_wstring(faults) + L" with faults, " +
              counted(others, L"other", L"others") + L"; " + std::to_wstring(looked) +
              L" looked at, " + std::to_wstring(result.libraries.size()) + L" recorded");
}

} // namespace

int list(const Common& common) {
    const Recorded recorded(common);
    const Tools::Discovery discovery =
        Tools::discover(Tools::foldersOf(Tools::pathOf(common.path)));
    Tools::ExplainOptions options;
    options.recorded = recorded.get();
    options.hosts = common.host.paths();
    Json files = Json::array();
    bool faults = !recorded.sound;
    const auto tell = [&](const std::filesystem::path& file, const Tools::Finding& finding,
                          const std::vector<Tools::Finding>& notes) {
        faults = faults || isFault(finding);
        if (common.json) {
            files.push_back(jsonOfFile(file, finding, notes));
            return;
        }
        printFile(file, finding, notes);
        if (finding.verdict == Tools::Verdict::otherAbi ||
            finding.verdict == Tools::Verdict::otherInterface)
            printSentence(finding); // It names both sides.
    };
    for (const Tools::Candidate& candidate : discovery.candidates) {
        // Only the dependencies of component libraries matter; searching them takes time.
        options.followDependencies = false;
        Tools::Explanation explanation = Tools::explainFile(candidate.path, options);
        options.followDependencies = true;
        if (explanation.verdict.verdict == Tools::Verdict::component)
            explanation = Tools::explainFile(candidate.path, options);
        faults = faults || failedEarlier(explanation);
        tell(candidate.path, withUidTaken(explanation), explanation.notes);
    }
    for (const Tools::Discovery::LeftOut& left : discovery.leftOut)
        tell(left.path, left.finding, {});
    if (common.json)
        printJson({{"files", files}});
    return faults ? exitFailure : exitSuccess;
}

int explain(const Common& common, const ExplainArguments& arguments, const ProbeArguments& probe) {
    const Recorded recorded(common);
    Tools::ConsoleController controller;
    Tools::ExplainOptions options;
    options.recorded = recorded.get();
    options.hosts = common.host.paths();
    options.load = arguments.load;
    const auto folders = Tools::foldersOf(Tools::pathOf(arguments.path));
    options.folders = arguments.path.empty() ? nullptr : &folders;
    options.probe = probe.options();
    options.probe.interrupted = [&] { return controller.isInterrupted(); };
    Json files = Json::array();
    bool faults = !recorded.sound;
    for (const std::string& file : arguments.files) {
        const Tools::Explanation explanation = Tools::explainFile(Tools::pathOf(file), options);
        // The user expects a component, so every other file is a failure, not only a fault.
        faults = faults || failedEarlier(explanation) || isPassedBy(explanation) ||
                 isDisabled(explanation) ||
                 Tools::severityOf(explanation.verdict.verdict) != Tools::Severity::good;
        if (common.json)
            files.push_back(jsonOfExplanation(explanation));
        else
            printExplanation(explanation);
    }
    if (common.json)
        printJson({{"files", files}});
    return faults ? exitFailure : exitSuccess;
}

int scan(const Common& common, const ProbeArguments& probe) {
    Tools::ConsoleController controller;
    Tools::ScanOptions options;
    options.folders = Tools::foldersOf(Tools::pathOf(common.path));
    options.list = Tools::pathOf(common.cache);
    options.hosts = common.host.paths();
    options.retry = probe.retry;
    options.jobs = probe.jobs;
    options.probe = probe.options();
    options.controller = &controller;
    const Tools::ScanResult result = Tools::scan(options);
    controller.clearLine();
    reportList(controller, Tools::displayName(options.list), result);
    bool faults = result.interrupted || !result.notWritten.empty();
    Json files = Json::array();
    for (const Tools::ScannedFile& file : result.files) {
        faults = faults || isFault(file.verdict);
        if (common.json) {
            files.push_back(jsonOfFile(file.path, file.verdict, file.notes));
            files.back()["recorded"] = file.recorded;
            files.back()["looked"] = file.looked;
        } else {
            printFile(file.path, file.verdict, file.notes);
            if (isFault(file.verdict))
                printSentence(file.verdict);
        }
    }
    if (common.json)
        printJson({{"files", files},
                   {"rejected", utf8(result.rejected)},
                   {"keptAs", utf8(Tools::displayName(result.keptAs))},
                   {"notWritten", utf8(result.notWritten)},
                   {"interrupted", result.interrupted}});
    else
        printSummary(result);
    return faults ? exitFailure : exitSuccess;
}

} // namespace Mz::Commands

// SPDX-License-Identifier: BSL-1.0
/// Runs the checks of one library in a few child processes:
/// - one that checks most rules, and is started again without the call that ended it;
/// - one for the rules that load and unload the library;
/// - two that list all answers of the library, in different surroundings. Only if the answers
///   differ, further ones find out which change of the surroundings matters.
#include "components/componentTools/check.h"

#include "components/componentTools/checking/checkChild.h"
#include "components/componentTools/checking/rules.h"
#include "components/componentTools/discovery.h"
#include "components/componentTools/explain.h"
#include "components/componentTools/platform/system.h"
#include "components/componentTools/probing/probeProcess.h"

#include <algorithm>
#include <charconv>
#include <stdexcept>

namespace Mz::Tools {

namespace {

/// The largest number of processes for the rules of one kind. A library that ends each of them is
/// faulty enough.
constexpr int mostProcesses = 25;

/// The rules that are checked first.
constexpr const char* loadsRule = "library-loads";
constexpr const char* unloadsRule = "library-unloads";
constexpr const char* answersRule = "description-answers";

constexpr const char* memoryRule = "surroundings-memory";

/// The rule that all other rules check, each in its calls.
constexpr const char* exceptionsRule = "exceptions-allowed";

/// What a value of `CheckOptions::reproduce` says: "RULE" or "RULE:BUILDER:INPUT:SEED".
struct Reproduction {
    std::string rule;
    int builder = -1, input = -1;
    std::optional<std::uint32_t> seed;
};

template <class Number>
std::optional<Number> numberOf(std::string_view text) {
    Number number{};
    const auto [end, failure] = std::from_chars(text.data(), text.data() + text.size(), number);
    return failure == std::errc() && end == text.data() + text.size() ? std::optional(number)
                                                                      : std::nullopt;
}

Reproduction parseReproduction(const std::string& text) {
    std::vector<std::string> parts{""};
    for (const char character : text)
        if (character == ':')
            parts.emplace_back();
        else
            parts.back() += character;
    Reproduction result{parts[0], -1, -1, std::nullopt};
    const bool whole = parts.size() == 4;
    if (whole) {
        const auto builder = numberOf<int>(parts[1]), input = numberOf<int>(parts[2]);
        result.seed = numberOf<std::uint32_t>(parts[3]);
        result.builder = builder.value_or(-1);
        result.input = input.value_or(-1);
    }
    const bool valid =
        whole ? result.seed && result.builder >= 0 && result.input >= 0 : parts.size() == 1;
    if (!text.empty() && (!valid || !findCheckRule(result.rule)))
        throw std::invalid_argument("no such rule: " + text);
    return result;
}

std::wstring seconds(std::chrono::milliseconds time) {
    const auto count = (time.count() + 999) / 1000;
    return std::to_wstring(count) + (count == 1 ? L" second" : L" seconds");
}

/// Returns what happened to a process, as the end of a sentence.
std::wstring endingOf(const System::ChildResult& child, const CheckReport& report,
                      const ProbeOptions& limits) {
    using End = System::ChildResult::End;
    if (child.end == End::timedOut)
        return L"does not return within " + seconds(limits.timeLimit);
    if (child.end == End::outOfMemory)
        return L"uses more than " + std::to_wstring(limits.memoryLimit >> 20) + L" MiB of memory";
    if (!report.fault.empty())
        return report.fault;
    if (child.end == End::crashed)
        return L"crashes: " + child.detail;
    // A part of a message is not from the check, which ends the process after whole ones only.
    if (report.garbled || child.end == End::tooMuchOutput || !child.output.empty())
        return L"writes into files that are not its own";
    return L"ends the process, with status " + std::to_wstring(child.status);
}

/// Returns what ended a process, and how, without a full stop.
std::wstring sentenceOnEnd(const System::ChildResult& child, const CheckReport& report,
                           const ProbeOptions& limits) {
    std::wstring sentence = report.activity.what;
    if (sentence.empty())
        sentence = L"the library";
    return sentence + L" " + endingOf(child, report, limits);
}

/// The check of one library.
class CheckRun {
  public:
    CheckRun(const std::filesystem::path& file, const CheckOptions& checkOptions)
        : options(checkOptions), wanted(parseReproduction(checkOptions.reproduce)) {
        result.file = file;
        task.file = std::filesystem::absolute(file);
        task.seed = wanted.seed.value_or(options.seed);
        task.fuzzMilliseconds = static_cast<int>(options.fuzzTime.count());
        task.threadSafe = options.threadSafe;
        task.builder = wanted.builder;
        task.input = wanted.input;
        for (const std::filesystem::path& sample : options.samples)
            task.samples.push_back(std::filesystem::absolute(sample));
    }

    CheckResult run() {
        if (isComponent()) {
            runRules(RuleProcess::main);
            if (!fatal && !result.interrupted)
                runRules(RuleProcess::apart);
            if (!fatal && !result.interrupted)
                runSurroundings();
        }
        sortFindings();
        return std::move(result);
    }

  private:
    bool isWanted(const char* id) const { return wanted.rule.empty() || wanted.rule == id; }

    void add(std::string_view rule, const std::wstring& place, const std::wstring& sentence,
             const std::string& reproduce = {}) {
        add({findCheckRule(rule), place, sentence, reproduce});
    }

    void add(CheckFinding finding) {
        const bool known = std::any_of(
            result.findings.begin(), result.findings.end(), [&](const CheckFinding& other) {
                return other.rule == finding.rule && other.place == finding.place &&
                       other.sentence == finding.sentence;
            });
        if (known)
            return;
        if (finding.reproduce.empty())
            finding.reproduce = finding.rule->id;
        result.findings.push_back(std::move(finding));
    }

    bool isComponent() {
        ExplainOptions fromOutside;
        fromOutside.hosts = options.hosts;
        const Explanation explanation = explainFile(task.file, fromOutside);
        if (severityOf(explanation.verdict.verdict) == Severity::good)
            return true;
        addVerdict(explanation.verdict);
        return false;
    }

    void addVerdict(const Finding& verdict) {
        std::wstring sentence = sentenceOf(verdict) + L".";
        if (const std::wstring cure = cureOf(verdict); !cure.empty())
            sentence += L" To solve this, " + cure + L".";
        add(verdict.verdict == Verdict::needsHost ? "library-host" : "library-is-component", {},
            sentence);
    }

    /// How a process ended, and what it sent.
    struct Outcome {
        System::ChildResult child;
        CheckReport report;
    };

    /// Runs the task in a child process, or in this one.
    Outcome runTask() {
        if (!options.inProcess)
            return runChildProcess();
        Outcome outcome;
        CheckSender sender([&](std::string message) { decodeReport(message, outcome.report); });
        carryOut(task, sender);
        outcome.child.end = System::ChildResult::End::exited;
        return outcome;
    }

    Outcome runChildProcess() const {
        Outcome outcome;
        const ProbeOptions& process = options.process;
        // A process may end before it is waited for, and so before the user is asked.
        if (process.interrupted && process.interrupted()) {
            outcome.child.end = System::ChildResult::End::interrupted;
            return outcome;
        }
        const std::uint64_t refused = refusedMemory(process);
        System::ChildLimits limits{process.timeLimit, process.memoryLimit, refused, longestAnswer,
                                   process.interrupted};
        limits.outputRestartsTime = true;
        limits.received = [&](std::string& bytes) { decodeReport(bytes, outcome.report); };
        std::vector<std::filesystem::path> arguments{checkArgument, std::to_string(refused),
                                                     encodeTask(task), task.file};
        arguments.insert(arguments.end(), task.samples.begin(), task.samples.end());
        outcome.child = System::runChild(probeProgram(process), arguments, limits);
        return outcome;
    }

    void runRules(RuleProcess process) {
        task.rules.clear();
        for (const RuleEntry& entry : ruleEntries())
            if (entry.process == process &&
                (isWanted(entry.facts.id) || wanted.rule == exceptionsRule))
                task.rules.push_back(entry.facts.id);
        // The others depend on these, and the library must not be held while it is unloaded.
        if (process == RuleProcess::main) {
            for (const char* first : {loadsRule, unloadsRule, answersRule})
                std::erase(task.rules, first);
            task.rules.insert(task.rules.begin(), {loadsRule, answersRule});
            if (isWanted(unloadsRule))
                task.rules.insert(std::next(task.rules.begin()), unloadsRule);
        }
        for (int count = 0; count < mostProcesses && !task.rules.empty(); ++count)
            if (!takeReport(runTask()))
                break;
        for (const std::string& left : task.rules)
            result.notRun.push_back(findCheckRule(left));
    }

    /// Takes the findings of one process. Returns whether another one must check the rest, which
    /// is in the task.
    bool takeReport(const Outcome& outcome) {
        using End = System::ChildResult::End;
        const auto& [child, report] = outcome;
        for (const CheckFinding& finding : report.findings) {
            fatal = fatal || finding.rule->id == std::string_view(loadsRule) ||
                    finding.rule->id == std::string_view(answersRule);
            if (finding.rule->id == std::string_view(loadsRule))
                addLoadFailure(finding);
            else if (isWanted(finding.rule->id) || fatal)
                add(finding);
        }
        for (const std::string& id : report.skipped)
            if (const CheckRule* rule = findCheckRule(id))
                result.notRun.push_back(rule);
        if (!report.builders.empty())
            result.builders = report.builders;
        if (child.end == End::interrupted) {
            result.interrupted = true;
            return false;
        }
        if (child.end == End::notStarted)
            throw std::runtime_error("the process of the check could not be started: " +
                                     std::string(child.detail.begin(), child.detail.end()));
        if (report.done) {
            task.rules.clear();
            return false;
        }
        return takeEnd(child, report);
    }

    /// After a process that ended early: reports that, and removes from the task what was checked.
    bool takeEnd(const System::ChildResult& child, const CheckReport& report) {
        std::string rule = report.rule;
        if (rule.empty())
            rule = loadsRule;
        const CheckActivity& activity = report.activity;
        std::wstring sentence = sentenceOnEnd(child, report, options.process);
        if (!activity.detail.empty())
            sentence += L", with " + activity.detail;
        add(rule, activity.place, sentence + L". Repeat it in a debugger, with --in-process.",
            activity.reproduce);
        const auto ended = std::find(task.rules.begin(), task.rules.end(), rule);
        const bool progress = !activity.key.empty() && task.avoided.insert(activity.key).second;
        const bool repeats = progress || ended == task.rules.end();
        task.rules.erase(task.rules.begin(), ended + (repeats ? 0 : 1));
        fatal = fatal || rule == loadsRule || rule == answersRule;
        return !fatal;
    }

    /// A library that needs its host fails to load, too.
    void addLoadFailure(const CheckFinding& finding) {
        ExplainOptions load;
        load.load = true;
        load.probe = options.process;
        const Explanation explanation = explainFile(task.file, load);
        if (explanation.verdict.verdict == Verdict::needsHost)
            addVerdict(explanation.verdict);
        else
            add(finding);
    }

    // ---- Surroundings -------------------------------------------------------------------------

    /// One change of the surroundings, and the rule that it serves.
    struct Change {
        const char* rule;
        const wchar_t* where; ///< the end of a sentence
        const wchar_t* remedy;
        void (*enter)(CheckTask&);
    };

    static const std::vector<Change>& changes() {
        static const std::vector<Change> all{
            // First, because what it finds changes with every other change, too.
            {memoryRule, L"in a process whose memory contained something else",
             L"Initialise every variable, and write no addresses.",
             [](CheckTask& surveyed) { surveyed.memoryPattern = 0xA5; }},
            {"surroundings-locale", L"under a locale with a decimal comma",
             L"Do not use the locale of the process.",
             [](CheckTask& surveyed) { surveyed.otherLocale = true; }},
            {"surroundings-folder", L"in another working folder", L"Do not use the working folder.",
             [](CheckTask& surveyed) { surveyed.otherFolder = true; }},
            {"surroundings-input", L"without standard input", L"Do not use standard input.",
             [](CheckTask& surveyed) { surveyed.noInput = true; }}};
        return all;
    }

    template <class Enter>
    Outcome surveyAfter(Enter enter) {
        const CheckTask saved = task;
        enter(task);
        Outcome outcome = runChildProcess();
        task = saved;
        result.interrupted =
            result.interrupted || outcome.child.end == System::ChildResult::End::interrupted;
        return outcome;
    }

    void runSurroundings() {
        std::vector<const Change*> checked;
        for (const Change& change : changes())
            if (isWanted(change.rule))
                checked.push_back(&change);
        if (checked.empty())
            return;
        task.rules.clear();
        if (options.inProcess) {
            for (const Change* change : checked)
                result.notRun.push_back(findCheckRule(change->rule));
            return;
        }
        Outcome plain = surveyAfter([](CheckTask&) {});
        const Outcome changed = surveyAfter([&](CheckTask& surveyed) {
            for (const Change* change : checked)
                change->enter(surveyed);
        });
        if (result.interrupted || (plain.report.done && changed.report.done &&
                                   plain.report.answers == changed.report.answers))
            return;
        dropUnstable(plain);
        for (const Change* change : checked)
            compare(*change, plain, surveyAfter(change->enter));
    }

    /// Reports and removes the answers that differ without any change of the surroundings.
    void dropUnstable(Outcome& plain) {
        const Outcome again = surveyAfter([](CheckTask&) {});
        if (!again.report.done || !plain.report.done)
            return;
        const auto& answers = again.report.answers;
        const auto isUnstable = [&](const auto& answer) {
            const auto other = answers.find(answer.first);
            return other == answers.end() || other->second != answer.second;
        };
        const auto first =
            std::find_if(plain.report.answers.begin(), plain.report.answers.end(), isUnstable);
        if (first != plain.report.answers.end() && isWanted(memoryRule))
            add(memoryRule, {},
                L"the answer differs from process to process: " + first->first +
                    L". Initialise every variable, and write no addresses, times or random "
                    L"values.");
        std::erase_if(plain.report.answers, isUnstable);
    }

    /// Reports the first answer that differs, and removes all that do from `plain`: one cause is
    /// one finding.
    void compare(const Change& change, Outcome& plain, const Outcome& changed) {
        if (result.interrupted)
            return;
        const CheckReport& report = changed.report;
        if (!report.done)
            return add(change.rule, report.activity.place,
                       sentenceOnEnd(changed.child, report, options.process) + L", " +
                           change.where + L". " + change.remedy);
        const auto differs = [&](const auto& answer) {
            const auto other = report.answers.find(answer.first);
            return other == report.answers.end() || other->second != answer.second;
        };
        auto& answers = plain.report.answers;
        const auto first = std::find_if(answers.begin(), answers.end(), differs);
        if (first == answers.end())
            return;
        add(change.rule, {},
            L"the answer changes " + std::wstring(change.where) + L": " + first->first + L". " +
                change.remedy);
        std::erase_if(answers, differs);
    }

    void sortFindings() {
        const auto& rules = checkRules();
        std::stable_sort(result.findings.begin(), result.findings.end(),
                         [&](const CheckFinding& a, const CheckFinding& b) {
                             return std::find(rules.begin(), rules.end(), a.rule) <
                                    std::find(rules.begin(), rules.end(), b.rule);
                         });
    }

    const CheckOptions& options;
    Reproduction wanted;
    CheckTask task;
    CheckResult result;
    bool fatal = false; ///< the library cannot be used at all
};

} // namespace

CheckResult checkLibrary(const std::filesystem::path& file, const CheckOptions& options) {
    return CheckRun(file, options).run();
}

namespace {

bool hasBuilder(const CheckResult& library, const QrUid& uid) {
    return std::any_of(library.builders.begin(), library.builders.end(),
                       [&](const CheckedBuilder& builder) { return builder.uid == uid; });
}

/// Removes the findings of stored classes whose builder another library has.
void dropClassesOfOthers(std::vector<CheckResult>& libraries) {
    for (CheckResult& one : libraries)
        std::erase_if(one.findings, [&](const CheckFinding& finding) {
            return !(finding.missingClass == QrUid{}) &&
                   std::any_of(libraries.begin(), libraries.end(), [&](const CheckResult& other) {
                       return hasBuilder(other, finding.missingClass);
                   });
        });
}

} // namespace

void compareLibraries(std::vector<CheckResult>& libraries) {
    dropClassesOfOthers(libraries);
    for (CheckResult& one : libraries)
        for (const CheckedBuilder& builder : one.builders)
            for (const CheckResult& other : libraries) {
                if (&other == &one || !hasBuilder(other, builder.uid) || builder.uid == QrUid{})
                    continue;
                one.findings.push_back({findCheckRule("uid-free"),
                                        placeOf(builder.name, builder.uid),
                                        displayName(other.file) +
                                            L" has a builder with the same uid, so that hosts "
                                            L"find only one of them. Make a new uid.",
                                        "uid-free",
                                        {}});
            }
}

} // namespace Mz::Tools

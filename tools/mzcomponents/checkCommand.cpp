// SPDX-License-Identifier: BSL-1.0
/// Runs the checks of several libraries in parallel threads, which only wait for child processes.
/// The main thread watches for Ctrl-C, because the console controller is used by one thread.
#include "tools/mzcomponents/checkCommand.h"

#include "components/componentTools/consoleText.h"
#include "components/componentTools/discovery.h"
#include "tools/mzcomponents/checkReports.h"
#include "tools/mzcomponents/output.h"
#include "tools/mzcomponents/suppressions.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <atomic>
#include <future>
#include <stdexcept>
#include <thread>

namespace Mz::Commands {

namespace {

Tools::Grade gradeNamed(const std::string& name) {
    for (const Tools::Grade grade : {Tools::Grade::note, Tools::Grade::warning})
        if (name == Tools::nameOf(grade))
            return grade;
    return Tools::Grade::error;
}

int explainRule(const std::string& id) {
    if (id == "all") {
        for (const Tools::CheckRule* rule : Tools::checkRules())
            printLine(padded(wide(rule->id), 24) + padded(wide(Tools::nameOf(rule->grade)), 9) +
                      rule->title);
        return exitSuccess;
    }
    const Tools::CheckRule* const rule = Tools::findCheckRule(id);
    if (!rule) {
        printError(toWide(id) + L": there is no such rule; --explain all lists them");
        return exitUsage;
    }
    printLine(wide(rule->id) + L" (" + wide(Tools::nameOf(rule->grade)) + L", " +
              wide(rule->group) + L")");
    printLine(rule->title);
    printLine(rule->explanation);
    return exitSuccess;
}

/// Returns the libraries to check: the named files, and the component libraries of the folders.
std::vector<std::filesystem::path> librariesOf(const CheckArguments& arguments, bool& faulty) {
    std::vector<std::filesystem::path> files;
    for (const std::string& file : arguments.files)
        files.push_back(Tools::pathOf(file));
    if (arguments.path.empty())
        return files;
    const Tools::Discovery discovery =
        Tools::discover(Tools::foldersOf(Tools::pathOf(arguments.path)));
    for (const Tools::Discovery::LeftOut& left : discovery.leftOut) {
        printError(shown(left.path) + L": " + Tools::sentenceOf(left.finding));
        faulty = true;
    }
    Tools::ExplainOptions fromOutside;
    fromOutside.followDependencies = false;
    for (const Tools::Candidate& candidate : discovery.candidates)
        if (Tools::severityOf(Tools::explainFile(candidate.path, fromOutside).verdict.verdict) !=
            Tools::Severity::bystander)
            files.push_back(candidate.path);
    return files;
}

Tools::CheckOptions optionsOf(const CheckArguments& arguments, const ProbeArguments& probe) {
    Tools::CheckOptions options;
    options.process = probe.options();
    options.hosts = arguments.host.paths();
    options.seed = arguments.seed;
    options.fuzzTime =
        std::chrono::milliseconds(static_cast<long long>(arguments.fuzzSeconds * 1000));
    for (const std::string& sample : arguments.samples)
        options.samples.push_back(Tools::pathOf(sample));
    options.threadSafe = arguments.threadSafe;
    options.reproduce = arguments.reproduce;
    options.inProcess = arguments.inProcess;
    return options;
}

/// Checks all libraries, each once, and returns the results in the same order.
class ParallelChecks {
  public:
    ParallelChecks(const std::vector<std::filesystem::path>& libraries,
                   const Tools::CheckOptions& checkOptions)
        : files(libraries), options(checkOptions), results(libraries.size()) {
        options.process.interrupted = [this] { return interrupted.load(); };
    }

    /// \throws what the check of a library threw
    std::vector<Tools::CheckResult> run(std::size_t jobs, Tools::ConsoleController& controller) {
        std::vector<std::future<void>> workers;
        for (std::size_t job = 0; job < std::min(jobs, files.size()); ++job)
            workers.push_back(std::async(std::launch::async, [this] { work(); }));
        for (std::future<void>& worker : workers)
            while (worker.wait_for(std::chrono::milliseconds(50)) != std::future_status::ready)
                if (controller.isInterrupted())
                    interrupted = true;
        for (std::future<void>& worker : workers)
            worker.get();
        return std::move(results);
    }

    /// Checks them one after the other in this thread.
    std::vector<Tools::CheckResult> runHere() {
        work();
        return std::move(results);
    }

  private:
    void work() {
        for (std::size_t index = next++; index < files.size() && !interrupted; index = next++)
            results[index] = Tools::checkLibrary(files[index], options);
    }

    const std::vector<std::filesystem::path>& files;
    Tools::CheckOptions options;
    std::vector<Tools::CheckResult> results;
    std::atomic<std::size_t> next{0};
    std::atomic<bool> interrupted{false};
};

std::vector<Tools::CheckResult> checkAll(const std::vector<std::filesystem::path>& files,
                                         const CheckArguments& arguments,
                                         const ProbeArguments& probe) {
    Tools::ConsoleController controller;
    ParallelChecks checks(files, optionsOf(arguments, probe));
    if (arguments.inProcess) {
        reserveResults();
        return checks.runHere();
    }
    const std::size_t processors = std::max(1u, std::thread::hardware_concurrency());
    return checks.run(arguments.jobs ? arguments.jobs : processors, controller);
}

/// Marks the findings that are suppressed.
std::vector<CheckedLibrary> judged(std::vector<Tools::CheckResult> results,
                                   Suppressions& suppressions) {
    std::vector<CheckedLibrary> libraries;
    for (Tools::CheckResult& result : results) {
        CheckedLibrary& library = libraries.emplace_back();
        for (const Tools::CheckFinding& finding : result.findings)
            library.reasons.push_back(suppressions.reasonFor(finding.rule->id, result.file));
        library.result = std::move(result);
    }
    return libraries;
}

bool writeReports(const std::vector<CheckedLibrary>& libraries, const CheckArguments& arguments,
                  Tools::Grade failOn) {
    bool written = true;
    if (!arguments.junit.empty())
        written = writeFile(arguments.junit, junitOf(libraries, failOn)) && written;
    if (!arguments.sarif.empty())
        written = writeFile(arguments.sarif, sarifOf(libraries)) && written;
    return written;
}

} // namespace

void addCheckCommand(CLI::App& app, CheckArguments& arguments, ProbeArguments& probe,
                     std::function<int()>& command) {
    CLI::App* const check = app.add_subcommand(
        "check", "Checks component libraries in child processes, and tells what is wrong with "
                 "them and how to solve it.");
    check->add_option("FILE", arguments.files, "The libraries")->type_name("");
    check
        ->add_option("--path", arguments.path,
                     "Check the component libraries of these folders, too, separated by ';'")
        ->type_name("PATH");
    check
        ->add_option("--sample", arguments.samples,
                     "A file that import builders can read; may be repeated")
        ->type_name("FILE")
        ->allow_extra_args(false); // What follows it is a library.
    addHostOption(*check, arguments.host);
    check
        ->add_option("--fail-on", arguments.failOn,
                     "The least serious findings that cause status 1: error, warning or note")
        ->type_name("GRADE")
        ->check(CLI::IsMember({"error", "warning", "note"}))
        ->capture_default_str();
    check
        ->add_option("--suppress", arguments.suppressions,
                     "A file of findings to tolerate, each with its reason")
        ->type_name("FILE");
    check->add_option("--seed", arguments.seed, "The start of the sequence of random input")
        ->capture_default_str();
    check
        ->add_option("--fuzz", arguments.fuzzSeconds,
                     "Seconds that each rule which reads input goes on with random input")
        ->check(CLI::Range(0.0, 86400.0));
    check
        ->add_option("--reproduce", arguments.reproduce,
                     "Check only this rule, or repeat this finding")
        ->type_name("VALUE");
    check->add_flag("--in-process", arguments.inProcess,
                    "Check in this process, for a debugger; a crash ends it");
    check->add_flag("--thread-safe", arguments.threadSafe,
                    "The libraries say that several threads may use them: check that");
    check
        ->add_option("--jobs", arguments.jobs,
                     "Libraries to check at a time; the default is the number of processors")
        ->check(CLI::Range(1u, 256u));
    check
        ->add_option("--explain", arguments.explained,
                     "Explain a rule instead of a check; \"all\" lists the rules")
        ->type_name("RULE");
    check->add_flag("--json", arguments.json, "Write the result as JSON");
    check->add_option("--junit", arguments.junit, "Write the result to this file as JUnit XML, too")
        ->type_name("FILE");
    check->add_option("--sarif", arguments.sarif, "Write the result to this file as SARIF, too")
        ->type_name("FILE");
    check->add_option("--time-limit", probe.seconds, "Seconds that a library may take for a call")
        ->check(CLI::Range(0.1, 86400.0))
        ->capture_default_str();
    check->add_option("--memory-limit", probe.mebibytes, "MiB that its process may use meanwhile")
        ->check(CLI::Range(16u, 1u << 20))
        ->capture_default_str();
    check->footer("Example:\n  mzcomponents check mesh.so --sample part.obj");
    check->callback([&] {
        if (arguments.files.empty() && arguments.path.empty() && arguments.explained.empty())
            throw CLI::RequiredError("FILE, --path or --explain");
        command = [&] { return Mz::Commands::check(arguments, probe); };
    });
}

int check(const CheckArguments& arguments, const ProbeArguments& probe) {
    if (!arguments.explained.empty())
        return explainRule(arguments.explained);
    Suppressions suppressions;
    if (!arguments.suppressions.empty() && !suppressions.read(arguments.suppressions))
        return exitUsage;
    const Tools::Grade failOn = gradeNamed(arguments.failOn);
    bool faulty = false;
    const std::vector<std::filesystem::path> files = librariesOf(arguments, faulty);
    std::vector<Tools::CheckResult> results;
    try {
        results = checkAll(files, arguments, probe);
    } catch (const std::invalid_argument& failure) {
        printError(toWide(failure.what()));
        return exitUsage;
    }
    const bool interrupted = std::any_of(results.begin(), results.end(),
                                         [](const auto& result) { return result.interrupted; });
    Tools::compareLibraries(results);
    const std::vector<CheckedLibrary> libraries = judged(std::move(results), suppressions);
    if (arguments.json)
        printJson(jsonOf(libraries));
    else
        printChecks(libraries);
    suppressions.printUnused();
    faulty = !writeReports(libraries, arguments, failOn) || faulty || interrupted ||
             anyFails(libraries, failOn);
    return faulty ? exitFailure : exitSuccess;
}

} // namespace Mz::Commands

// SPDX-License-Identifier: BSL-1.0
/// The program mzcomponents: inspects, scans and uses component libraries.
///
/// The parser only fills in `Arguments` and selects a command, which runs after parsing, so that a
/// usage error has no side effects. Exceptions end here.
#include "components/componentTools/consoleText.h"
#include "tools/mzcomponents/bisectCommand.h"
#include "tools/mzcomponents/checkCommand.h"
#include "tools/mzcomponents/commands.h"
#include "tools/mzcomponents/exitGuard.h"
#include "tools/mzcomponents/helpCommand.h"
#include "tools/mzcomponents/newCommand.h"
#include "tools/mzcomponents/output.h"
#include "tools/mzcomponents/profileCommand.h"
#include "tools/mzcomponents/switchCommands.h"
#include "tools/mzcomponents/uidCommand.h"

#include "components/componentTools/standardOutput.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cmath>
#include <functional>
#include <utility>

using namespace Mz::Commands;

namespace {

constexpr const char* about =
    "Lists component libraries, explains why a file is not one, and uses them.\n\n"
    "Exit status: 0 success; 1 a library, a file or a folder is faulty, or the output could not be "
    "written; 2 usage error.";

/// The parsed command line.
struct Arguments {
    Common common;
    ExplainArguments explain;
    ProbeArguments probe;
    ImportArguments import;
    GraphArguments graph;
    CheckArguments check;
    NewArguments made;
    UidArguments uid;
    ProfileArguments profile;
    SwitchArguments switching;
    BisectArguments bisecting;
    std::string shown;
    std::string topic;
    std::function<int()> command;
};

// Validators of values. Each returns an error message; empty if the value is valid.
std::string namesAFolder(const std::string& path) {
    return path.find_first_not_of(';') == std::string::npos ? "it names no folder" : "";
}

std::string namesAFile(const std::string& path) {
    return path.empty() ? "it names no file" : "";
}

std::string isFinite(const std::string& number) {
    double value = 0;
    return CLI::detail::lexical_cast(number, value) && std::isfinite(value) ? ""
                                                                            : "not a finite number";
}

/// Returns a word that the parser takes for one name. It would split `[a,b]`.
std::string asOneName(const std::string& word) {
    return word.starts_with('[') && word.ends_with(']') ? "./" + word : word;
}

CLI::App* addCommand(CLI::App& app, Arguments& arguments, const char* name, const char* text,
                     const char* example, std::string* hostPath = nullptr) {
    CLI::App* command = app.add_subcommand(name, text);
    command
        ->add_option("--path", hostPath ? *hostPath : arguments.common.path,
                     hostPath
                         ? "The search path of a host, folders separated by ';': report whether "
                           "it leads to the files"
                         : "The folders to search, separated by ';'. The default is the "
                           "current folder")
        ->type_name("PATH")
        ->check(namesAFolder);
    command->add_flag("--json", arguments.common.json, "Write the result as JSON");
    command->footer(std::string("Example:\n  ") + example);
    return command;
}

void addCache(CLI::App* command, Arguments& arguments, const char* text) {
    command->add_option("--cache", arguments.common.cache, text)
        ->type_name("FILE")
        ->check(namesAFile);
}

void addLimits(CLI::App* command, Arguments& arguments) {
    command
        ->add_option("--time-limit", arguments.probe.seconds,
                     "Seconds that a library may take to load and describe itself")
        ->check(CLI::Range(0.1, 86400.0))
        ->check(isFinite)
        ->capture_default_str();
    command
        ->add_option("--memory-limit", arguments.probe.mebibytes,
                     "MiB that its process may use meanwhile")
        ->check(CLI::Range(16u, 1u << 20))
        ->capture_default_str();
}

constexpr const char* readCache = "A recorded list to look files up in";
constexpr const char* updatedCache = "A recorded list to update and use";

void addLookCommands(CLI::App& app, Arguments& arguments) {
    CLI::App* list =
        addCommand(app, arguments, "list",
                   "Lists the candidates of the search path with their verdicts. Runs none of "
                   "their code.",
                   "mzcomponents list --path /opt/app/components");
    addCache(list, arguments, readCache);
    addHostOption(*list, arguments.common.host);
    list->callback(
        [&] { arguments.command = [&] { return Mz::Commands::list(arguments.common); }; });

    CLI::App* explain = addCommand(
        app, arguments, "explain",
        "Explains why each file is, or is not, a component library, and what to do about it.",
        "mzcomponents explain --load /opt/app/components/mesh.so", &arguments.explain.path);
    explain->add_option("FILE", arguments.explain.files, "The files")->type_name("")->required();
    explain->add_flag("--load", arguments.explain.load,
                      "Load each file in a child process and report the result");
    addCache(explain, arguments, readCache);
    addHostOption(*explain, arguments.common.host);
    addLimits(explain, arguments);
    explain->callback([&] {
        arguments.command = [&] {
            return Mz::Commands::explain(arguments.common, arguments.explain, arguments.probe);
        };
    });

    CLI::App* scan = addCommand(
        app, arguments, "scan",
        "Loads new and changed libraries in child processes and updates the recorded list: a host "
        "that reads it loads none of these libraries at start.",
        "mzcomponents scan --cache ~/.cache/app/components.list --path /opt/app/components");
    scan->add_option("--cache", arguments.common.cache, "The recorded list to update")
        ->type_name("FILE")
        ->required()
        ->check(namesAFile);
    addHostOption(*scan, arguments.common.host);
    scan->add_flag("--retry", arguments.probe.retry, "Retry libraries that failed earlier");
    scan->add_option("-j,--jobs", arguments.probe.jobs,
                     "Libraries to try at a time; 0 for the number of processors")
        ->check(CLI::Range(0u, 256u))
        ->capture_default_str();
    addLimits(scan, arguments);
    scan->callback([&] {
        arguments.command = [&] { return Mz::Commands::scan(arguments.common, arguments.probe); };
    });

    CLI::App* profile = addCommand(
        app, arguments, "profile",
        "Measures in child processes where the time of a host's start goes: which library makes it "
        "slow, and with what.",
        "mzcomponents profile --path /opt/app/components --svg start.svg");
    addCache(profile, arguments, "A recorded list: measure the start with it, too");
    addProfileOptions(*profile, arguments.profile);
    addLimits(profile, arguments);
    profile->callback([&] {
        arguments.command = [&] {
            return Mz::Commands::profile(arguments.common, arguments.profile, arguments.probe);
        };
    });
}

void addSearchCommand(CLI::App& app, Arguments& arguments) {
    CLI::App* bisect =
        addCommand(app, arguments, "bisect",
                   "Starts a host again and again with some components switched off, and finds the "
                   "one with which it fails, or those that only fail together.",
                   "mzcomponents bisect --path /opt/app/components --cache "
                   "~/.cache/app/components.list -- /opt/app/bin/app --self-test");
    addCache(bisect, arguments, updatedCache);
    bisect->get_option("--cache")->required();
    addBisectOptions(*bisect, arguments.bisecting);
    addLimits(bisect, arguments);
    bisect->callback([&] {
        arguments.command = [&] {
            return Mz::Commands::bisect(arguments.common, arguments.bisecting, arguments.probe);
        };
    });
}

void addUseCommands(CLI::App& app, Arguments& arguments) {
    CLI::App* types =
        addCommand(app, arguments, "types", "Lists the file types that the components import.",
                   "mzcomponents types --path /opt/app/components");
    addCache(types, arguments, updatedCache);
    addLimits(types, arguments);
    types->callback([&] {
        arguments.command = [&] { return Mz::Commands::types(arguments.common, arguments.probe); };
    });

    CLI::App* importer = addCommand(app, arguments, "import",
                                    "Imports files through the first component that can read them.",
                                    "mzcomponents import part.obj --path /opt/app/components");
    importer->add_option("FILE", arguments.import.files, "The files")->type_name("")->required();
    importer
        ->add_option("--save", arguments.import.save,
                     "Store the imported objects in this file, if all of them can be stored")
        ->type_name("FILE")
        ->check(namesAFile);
    importer->add_flag("--guarded", arguments.import.guarded,
                       "Import in child processes, with the limits of time and memory below: a "
                       "component that crashes or hangs does no harm. Only objects that can be "
                       "stored come back");
    addCache(importer, arguments, updatedCache);
    addLimits(importer, arguments);
    importer->callback([&] {
        arguments.command = [&] {
            return Mz::Commands::importFiles(arguments.common, arguments.import, arguments.probe);
        };
    });

    CLI::App* show = addCommand(
        app, arguments, "show",
        "Shows a recorded list, or the objects stored in a file, with their offsets in bytes.",
        "mzcomponents show ~/.cache/app/components.list");
    show->add_option("FILE", arguments.shown, "The file")->type_name("")->required();
    addCache(show, arguments, updatedCache);
    addLimits(show, arguments);
    show->callback([&] {
        arguments.command = [&] {
            return Mz::Commands::show(arguments.common, arguments.shown, arguments.probe);
        };
    });

    CLI::App* graph =
        addCommand(app, arguments, "graph",
                   "Draws the libraries, their builders, and the importers that use them, as DOT.",
                   "mzcomponents graph --path /opt/app/components --svg components.svg");
    graph
        ->add_option("--output", arguments.graph.output,
                     "Write the DOT text to this file instead of standard output")
        ->type_name("FILE")
        ->check(namesAFile);
    graph
        ->add_option("--svg", arguments.graph.svg,
                     "Draw it to this file with Graphviz, which must be installed")
        ->type_name("FILE")
        ->check(namesAFile);
    addCache(graph, arguments, updatedCache);
    addLimits(graph, arguments);
    graph->callback([&] {
        arguments.command = [&] {
            return Mz::Commands::graph(arguments.common, arguments.graph, arguments.probe);
        };
    });
}

int run(std::vector<std::string> words) {
    Arguments arguments;
    CLI::App app(about, "mzcomponents");
    app.require_subcommand(1);
    app.allow_windows_style_options(false); // "/folder/file" is a file on every platform.
    app.set_version_flag("--version", MZ_VERSION);
    addLookCommands(app, arguments);
    addUseCommands(app, arguments);
    addSearchCommand(app, arguments);
    addSwitchCommands(app, arguments.switching, arguments.command);
    addCheckCommand(app, arguments.check, arguments.probe, arguments.command);
    addNewCommand(app, arguments.made, arguments.command);
    addUidCommand(app, arguments.uid, arguments.command);
    addHelpCommand(app, arguments.topic, arguments.command);
    try {
        std::transform(words.begin(), words.end(), words.begin(), asOneName);
        std::reverse(words.begin(), words.end()); // The parser expects reverse order.
        app.parse(words);
    } catch (const CLI::ParseError& failure) {
        return app.exit(failure) == 0 ? exitSuccess : exitUsage;
    }
    return arguments.command();
}

/// Runs a command. Reports every exception that it, or a component, throws.
int runGuarded(const std::vector<std::string>& words) {
    try {
        return run(words);
    } catch (...) {
        printError(exceptionText());
        return exitFailure;
    }
}

} // namespace

int main(int argc, char** argv) {
    Mz::Tools::prepareProgram();
    const int status = runGuarded(Mz::Tools::argumentsOfProcess(argc, argv));
    commandIsDone();
    if (flushResults())
        return status;
    printError(L"the output could not be written");
    return status == exitSuccess ? exitFailure : status;
}

// SPDX-License-Identifier: BSL-1.0
/// With a list, both starts are measured: what the list saves is the difference. A list that cannot
/// be used is reported, and only the start without it is measured.
#include "tools/mzcomponents/profileCommand.h"

#include "components/componentTools/consoleText.h"
#include "components/componentTools/profileChart.h"
#include "tools/mzcomponents/output.h"
#include "tools/mzcomponents/profileReport.h"

#include <CLI/CLI.hpp>
#include <algorithm>

namespace Mz::Commands {

namespace {

MeasuredStarts measure(const Common& common, const ProfileArguments& arguments,
                       const ProbeArguments& probe) {
    Tools::ConsoleController controller;
    Tools::ProfileOptions options;
    options.folders = Tools::foldersOf(Tools::pathOf(common.path));
    options.runs = arguments.runs;
    options.process = probe.options();
    options.process.interrupted = [&] { return controller.isInterrupted(); };
    if (!common.cache.empty())
        options.list = Tools::pathOf(common.cache);
    MeasuredStarts measured{Tools::profileStart(options)};
    if (!options.list.empty() && measured.start.listProblem.empty() &&
        !measured.start.interrupted) {
        options.list.clear();
        measured.without = Tools::profileStart(options);
    }
    return measured;
}

/// Reports what kept the starts from being measured completely. Returns whether there was anything.
bool reportProblems(const MeasuredStarts& measured) {
    const Tools::StartProfile& start = measured.start;
    for (const Tools::Discovery::LeftOut& left : start.leftOut)
        printError(shown(left.path) + L": " + Tools::sentenceOf(left.finding));
    const Tools::StartProfile* const without = measured.without ? &*measured.without : nullptr;
    bool any = !start.leftOut.empty();
    for (const std::wstring& problem :
         {start.listProblem, start.problem, without ? without->problem : std::wstring()}) {
        any = any || !problem.empty();
        if (!problem.empty())
            printError(problem);
    }
    const bool interrupted = start.interrupted || (without && without->interrupted);
    if (interrupted)
        printError(L"the measurement was interrupted");
    return any || interrupted;
}

bool hasFaults(const Tools::StartProfile& profile) {
    return std::any_of(
        profile.libraries.begin(), profile.libraries.end(),
        [](const Tools::ProfiledLibrary& library) { return isFault(library.verdict); });
}

} // namespace

void addProfileOptions(CLI::App& command, ProfileArguments& arguments) {
    command
        .add_option("--runs", arguments.runs,
                    "The number of starts to measure; the results are medians")
        ->check(CLI::Range(1, 1000))
        ->capture_default_str();
    command.add_option("--svg", arguments.svg, "Draw a bar chart to this file, too")
        ->check([](const std::string& name) { return name.empty() ? "it names no file" : ""; });
}

int profile(const Common& common, const ProfileArguments& arguments, const ProbeArguments& probe) {
    const MeasuredStarts measured = measure(common, arguments, probe);
    bool faulty = reportProblems(measured) || hasFaults(measured.start) ||
                  (measured.without && hasFaults(*measured.without));
    if (common.json)
        printJson(jsonOf(measured));
    else
        printProfile(measured);
    if (!arguments.svg.empty())
        faulty = !writeFile(arguments.svg, Tools::chartOf(measured.start)) || faulty;
    return faulty ? exitFailure : exitSuccess;
}

} // namespace Mz::Commands

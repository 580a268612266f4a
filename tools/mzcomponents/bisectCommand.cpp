// SPDX-License-Identifier: BSL-1.0
/// The report is the result, on standard output. What happens before it goes to standard error: one
/// line for each start, the output of the host, and the question.
#include "tools/mzcomponents/bisectCommand.h"

#include "components/componentTools/bisect.h"
#include "components/componentTools/consoleText.h"
#include "components/componentTools/uidText.h"
#include "tools/mzcomponents/output.h"

#include <CLI/CLI.hpp>
#include <iostream>

namespace Mz::Commands {

namespace {

using BisectState = Tools::BisectResult::State;

void printProgress(const std::wstring& text) {
    std::cerr << Tools::forOutput(Tools::withoutControls(text)) << std::endl;
}

/// Asks the user until there is an answer. `std::nullopt` if the user quits, or the input ends.
std::optional<bool> ask(const Tools::HostStart& start) {
    std::string answer;
    do {
        std::cerr << "start " << start.number << ": " << Tools::forOutput(start.ending)
                  << ". Did it fail? [y/n/q] " << std::flush;
        if (!std::getline(std::cin, answer) || answer.starts_with('q'))
            return std::nullopt;
    } while (!answer.starts_with('y') && !answer.starts_with('n'));
    return answer.starts_with('y');
}

Tools::BisectOptions optionsOf(const Common& common, const BisectArguments& arguments,
                               const ProbeArguments& probe, Tools::ConsoleController& controller) {
    Tools::BisectOptions options;
    options.folders = Tools::foldersOf(Tools::pathOf(common.path));
    options.list = Tools::pathOf(common.cache);
    options.host = Tools::pathOf(arguments.host.front());
    for (std::size_t index = 1; index < arguments.host.size(); ++index)
        options.arguments.push_back(Tools::pathOf(arguments.host[index]));
    options.repeat = arguments.repeat;
    if (arguments.time > 0)
        options.timeLimit =
            std::chrono::milliseconds(static_cast<long long>(arguments.time * 1000));
    else if (arguments.ask)
        options.timeLimit = {}; // The user ends the host.
    options.runningIsGood = arguments.runningIsGood;
    if (arguments.ask)
        options.judge = ask;
    options.output = [](std::string_view text) { std::cerr << text << std::flush; };
    options.started = [&controller](const Tools::HostStart& start) {
        controller.clearLine();
        printProgress(L"start " + std::to_wstring(start.number) + L": " +
                      counted(start.active, L"component", L"components") + L", " + start.ending +
                      (start.failed ? L": fails" : L": good"));
    };
    options.probe = probe.options();
    options.controller = &controller;
    return options;
}

std::wstring answerOf(const Tools::BisectResult& result) {
    const std::size_t count = result.culprits.size();
    switch (result.state) {
    case BisectState::found:
        return count == 1 ? L"the host fails with this component"
                          : L"the host fails with these " + std::to_wstring(count) +
                                L" components together, and not without any one of them";
    case BisectState::allPass: return L"the host does not fail with all components";
    case BisectState::noneFails:
        return L"the host fails even if all components are switched off. Either they are not the "
               L"reason, or the host does not use Kit::listFromEnvironment";
    case BisectState::notStarted: return L"the host cannot be started: " + result.problem;
    case BisectState::stopped: break;
    }
    return count == 0 ? L"the search was stopped"
                      : L"the search was stopped. The culprit is among these " +
                            counted(count, L"component", L"components");
}

void printCulprit(const Tools::Culprit& culprit) {
    printLine(L"  " + Tools::displayName(culprit.path));
    printLine(L"    " + nameOf(culprit.verdict) + L": " + Tools::sentenceOf(culprit.verdict));
    printLine(L"    stamp: " + (culprit.stamp.empty() ? L"none" : culprit.stamp));
    printLine(L"    size " + std::to_wstring(culprit.record.size) + L", time " +
              std::to_wstring(culprit.record.time));
    for (const Tools::RecordedBuilder& builder : culprit.record.builders)
        printLine(L"    builder " + Tools::textOf(builder.uid) + L"  " + builder.name);
}

void printReport(const Tools::BisectResult& result, const BisectArguments& arguments) {
    printLine(answerOf(result));
    for (const Tools::Culprit& culprit : result.culprits)
        printCulprit(culprit);
    std::wstring host;
    for (const std::string& word : arguments.host)
        host += L" " + toWide(word);
    printLine(L"host:" + host);
    if (!result.ending.empty())
        printLine(L"its last failure: " + result.ending);
    printLine(counted(static_cast<std::size_t>(result.starts), L"start", L"starts") + L", " +
              std::to_wstring(result.failures) + L" failed; " +
              counted(result.components, L"component", L"components"));
    printLine(L"mzcomponents " + toWide(MZ_VERSION) + L": " + result.stamp);
}

const char* stateName(BisectState state) {
    switch (state) {
    case BisectState::found: return "found";
    case BisectState::allPass: return "allPass";
    case BisectState::noneFails: return "noneFails";
    case BisectState::notStarted: return "notStarted";
    case BisectState::stopped: break;
    }
    return "stopped";
}

Json reportOf(const Tools::BisectResult& result, const BisectArguments& arguments) {
    Json culprits = Json::array();
    for (const Tools::Culprit& culprit : result.culprits) {
        Json entry{{"file", utf8(Tools::displayName(culprit.path))}};
        entry.update(jsonOf(culprit.verdict));
        entry["stamp"] = utf8(culprit.stamp);
        entry["size"] = culprit.record.size;
        entry["time"] = culprit.record.time;
        entry["builders"] = jsonOf(culprit.record).at("builders");
        culprits.push_back(entry);
    }
    Json host = Json::array();
    for (const std::string& word : arguments.host)
        host.push_back(utf8(toWide(word)));
    return {{"result", stateName(result.state)},
            {"culprits", culprits},
            {"host", host},
            {"ending", utf8(result.ending)},
            {"problem", utf8(result.problem)},
            {"starts", result.starts},
            {"failures", result.failures},
            {"components", result.components},
            {"version", MZ_VERSION},
            {"stamp", utf8(result.stamp)}};
}

} // namespace

void addBisectOptions(CLI::App& command, BisectArguments& arguments) {
    command.add_option("HOST", arguments.host, "The host and its arguments, after --")
        ->type_name("")
        ->required();
    command
        .add_option("--repeat", arguments.repeat,
                    "Starts without a failure before a set of components counts as good, for a "
                    "failure that does not always show")
        ->check(CLI::Range(1, 1000))
        ->capture_default_str();
    command
        .add_option("--time", arguments.time,
                    "Seconds after which the host is killed. The default is 60, and none with "
                    "--ask")
        ->check(CLI::Range(0.1, 86400.0));
    command.add_flag("--running-is-good", arguments.runningIsGood,
                     "A host that still runs then is good. Without this option, it has failed");
    command.add_flag("--ask", arguments.ask, "Ask after each start whether it failed");
}

int bisect(const Common& common, const BisectArguments& arguments, const ProbeArguments& probe) {
    Tools::ConsoleController controller;
    const Tools::BisectResult result =
        Tools::bisect(optionsOf(common, arguments, probe, controller));
    controller.clearLine();
    reportList(controller, toWide(common.cache), result.scanned);
    if (common.json)
        printJson(reportOf(result, arguments));
    else
        printReport(result, arguments);
    return result.state == BisectState::found ? exitSuccess : exitFailure;
}

} // namespace Mz::Commands

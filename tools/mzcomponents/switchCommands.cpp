// SPDX-License-Identifier: BSL-1.0
/// Files are switched one by one, so that a wrong name does not prevent the others. A component
/// that is in the wanted state already is no failure: scripts may run twice.
#include "tools/mzcomponents/switchCommands.h"

#include "components/componentTools/consoleText.h"
#include "components/componentTools/disabled.h"
#include "components/componentTools/discovery.h"
#include "tools/mzcomponents/commands.h"
#include "tools/mzcomponents/output.h"

#include <CLI/CLI.hpp>

namespace Mz::Commands {

namespace {

CLI::App* addSwitch(CLI::App& app, SwitchArguments& arguments, const char* name, const char* text) {
    CLI::App* const command = app.add_subcommand(name, text);
    command->add_option("FILE", arguments.files, "The components")->type_name("")->required();
    command->add_option("--cache", arguments.cache, "The recorded list that hosts read")
        ->type_name("LIST")
        ->required()
        ->check([](const std::string& list) { return list.empty() ? "it names no file" : ""; });
    return command;
}

/// Switches each file by `change(file, list)`, and prints what became of it.
template <class Change>
int switchEach(const SwitchArguments& arguments, const wchar_t* done, const wchar_t* already,
               Change change) {
    bool failed = false;
    for (const std::string& name : arguments.files) {
        const std::filesystem::path file = Tools::pathOf(name);
        const Tools::SwitchResult result = change(file, Tools::pathOf(arguments.cache));
        failed = failed || !result.problem.empty();
        if (!result.problem.empty())
            printError(result.problem);
        else
            printLine(Tools::displayName(Tools::candidateOf(file).path) +
                      (result.changed ? done : already));
    }
    return failed ? exitFailure : exitSuccess;
}

} // namespace

void addSwitchCommands(CLI::App& app, SwitchArguments& arguments, std::function<int()>& command) {
    CLI::App* const off = addSwitch(app, arguments, "disable",
                                    "Switches components off: no host that reads the list loads "
                                    "them, and a scan keeps the choice when a file changes.");
    off->add_option("--reason", arguments.reason, "Why, for the output of list and explain")
        ->type_name("TEXT");
    off->footer("Example:\n  mzcomponents disable components/mesh.so --cache "
                "~/.cache/app/components.list --reason \"crashes on large files\"");
    off->callback([&] { command = [&] { return Mz::Commands::disable(arguments); }; });

    CLI::App* const on =
        addSwitch(app, arguments, "enable", "Switches components on that were switched off.");
    on->footer("Example:\n  mzcomponents enable components/mesh.so --cache "
               "~/.cache/app/components.list");
    on->callback([&] { command = [&] { return Mz::Commands::enable(arguments); }; });
}

int disable(const SwitchArguments& arguments) {
    return switchEach(arguments, L": switched off", L": was switched off already",
                      [&](const auto& file, const auto& list) {
                          return Tools::disableComponent(file, list, toWide(arguments.reason));
                      });
}

int enable(const SwitchArguments& arguments) {
    return switchEach(
        arguments, L": switched on", L": was not switched off",
        [](const auto& file, const auto& list) { return Tools::enableComponent(file, list); });
}

} // namespace Mz::Commands

// SPDX-License-Identifier: BSL-1.0
/// Prints sections of the pages that are built into the program. Several sections may be about one
/// topic: an exception with several reasons.
#include "tools/mzcomponents/helpCommand.h"

#include "tools/mzcomponents/commands.h"
#include "tools/mzcomponents/helpPages.h"
#include "tools/mzcomponents/output.h"

#include <CLI/CLI.hpp>

namespace Mz::Commands {

namespace {

void listTopics() {
    for (const HelpPage& page : helpPages()) {
        results() << page.text.substr(2, page.text.find('\n') - 2) << ":\n";
        for (const HelpTopic& topic : topicsOf(page))
            results() << "  " << topic.heading << '\n';
    }
}

} // namespace

void addHelpCommand(CLI::App& app, std::string& topic, std::function<int()>& command) {
    CLI::App* const help = app.add_subcommand(
        "help", "Says what a verdict, a rule of check or a reason of an exception means.");
    help->add_option("TOPIC", topic, "Its name; without it, the names of all topics are listed")
        ->type_name("");
    help->footer("Example:\n  mzcomponents help dependencyMissing");
    help->callback([&] { command = [&] { return Mz::Commands::help(topic); }; });
}

int help(const std::string& topic) {
    if (topic.empty()) {
        listTopics();
        return exitSuccess;
    }
    bool found = false;
    for (const HelpPage& page : helpPages())
        for (const HelpTopic& section : topicsOf(page))
            if (isNamed(section, topic)) {
                results() << (found ? "\n" : "") << section.heading << "\n\n" << section.text;
                found = true;
            }
    if (found)
        return exitSuccess;
    printError(toWide(topic) + L": there is no such topic; mzcomponents help lists them");
    return exitUsage;
}

} // namespace Mz::Commands

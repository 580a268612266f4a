// SPDX-License-Identifier: BSL-1.0
/// The number is parsed here and not by the parser, whose message would not name the bounds.
#include "tools/mzcomponents/uidCommand.h"

#include "tools/mzcomponents/commands.h"
#include "tools/mzcomponents/output.h"
#include "tools/mzcomponents/randomUid.h"

#include <CLI/CLI.hpp>
#include <charconv>

namespace Mz::Commands {

namespace {

constexpr int mostUids = 10000;

/// Returns the number that the text is; 0 if it is none from 1 to `mostUids`.
int countOf(const std::string& text) {
    int count = 0;
    const char* const end = text.data() + text.size();
    const std::from_chars_result result = std::from_chars(text.data(), end, count);
    return result.ec == std::errc() && result.ptr == end && count <= mostUids ? std::max(count, 0)
                                                                              : 0;
}

std::string isCount(const std::string& text) {
    return countOf(text) > 0
               ? ""
               : "\"" + text + "\" is not a number from 1 to " + std::to_string(mostUids);
}

} // namespace

void addUidCommand(CLI::App& app, UidArguments& arguments, std::function<int()>& command) {
    CLI::App* const uid = app.add_subcommand("uid", "Makes new uids, of random bits.");
    uid->add_option("COUNT", arguments.count, "How many, from 1 to 10000; the default is 1")
        ->type_name("")
        ->check(isCount);
    uid->add_flag("--words", arguments.words,
                  "Write four words, {0x..., 0x..., 0x..., 0x...}, instead of the text of "
                  "\"...\"_uid");
    uid->footer("Example:\n  mzcomponents uid 2");
    uid->callback([&] { command = [&] { return Mz::Commands::uid(arguments); }; });
}

int uid(const UidArguments& arguments) {
    for (int left = countOf(arguments.count); left > 0; --left) {
        const QrUid made = randomUid();
        results() << (arguments.words ? wordsOf(made) : literalOf(made)) << '\n';
    }
    return exitSuccess;
}

} // namespace Mz::Commands

// SPDX-License-Identifier: BSL-1.0
/// The option may be repeated, because the interfaces of a host may be spread over its program and
/// its libraries. A file that is missing is a usage error, and one without interfaces is reported:
/// nothing would be compared with it, and the user would not know.
#include "tools/mzcomponents/hostOption.h"

#include "components/componentTools/consoleText.h"
#include "components/componentTools/fingerprints.h"
#include "tools/mzcomponents/output.h"

#include <CLI/CLI.hpp>

namespace Mz::Commands {

std::vector<std::filesystem::path> HostFiles::paths() const {
    std::vector<std::filesystem::path> result;
    for (const std::string& file : files) {
        result.push_back(Tools::pathOf(file));
        if (Tools::fingerprintsOf(result.back()).empty())
            printError(Tools::displayName(result.back()) +
                       L": it describes no interface by MZ_INTERFACE, so nothing is compared with "
                       L"it");
    }
    return result;
}

void addHostOption(CLI::App& command, HostFiles& host) {
    command
        .add_option("--host", host.files,
                    "The program of the host, or a library of it: compare the interfaces that "
                    "both describe by MZ_INTERFACE; may be repeated")
        ->type_name("FILE")
        ->check(CLI::ExistingFile)
        ->allow_extra_args(false); // What follows it is a library.
}

} // namespace Mz::Commands

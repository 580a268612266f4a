// SPDX-License-Identifier: BSL-1.0
/// Tells callers whether there is something to compare. What is compared stays in
/// `inspecting/interfaceDifference.cpp`.
#include "components/componentTools/fingerprints.h"

#include "components/componentTools/inspecting/interfaceTables.h"

#include <algorithm>

namespace Mz::Tools {

std::vector<std::string> fingerprintsOf(const std::filesystem::path& file) {
    std::vector<std::string> names;
    for (const InterfaceTable& table : interfaceTablesOf(file))
        names.push_back(table.name);
    std::sort(names.begin(), names.end());
    names.erase(std::unique(names.begin(), names.end()), names.end());
    return names;
}

} // namespace Mz::Tools

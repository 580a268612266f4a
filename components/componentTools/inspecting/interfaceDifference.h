// SPDX-License-Identifier: BSL-1.0
/// Compares the interfaces with which a component was compiled with those of its host.
#pragma once

#include "components/componentTools/inspecting/interfaceTables.h"
#include "components/componentTools/verdict.h"

#include <filesystem>
#include <optional>
#include <vector>

namespace Mz::Tools {

/// Returns the verdict `otherInterface`, with the first difference, if an interface that both have
/// is not the same; else `std::nullopt`. Interfaces are the same if they have the same uid.
std::optional<Finding> interfaceDifference(const std::vector<InterfaceTable>& component,
                                           const std::vector<InterfaceTable>& host);

/// Returns the same for the file of a component. It is compared with the program and the
/// libMZcomponentManager of this process, and with the programs and libraries `hosts`.
std::optional<Finding> interfaceDifference(const std::filesystem::path& component,
                                           const std::vector<std::filesystem::path>& hosts);

} // namespace Mz::Tools

// SPDX-License-Identifier: BSL-1.0
/// The child process of a guarded import.
#pragma once

#include "components/componentTools/platform/confinement.h"

#include <string>
#include <vector>

namespace Mz::Tools {

/// Receives a task on standard input, imports the file that this process inherited, sends the
/// object and ends this process. \param arguments  `importArgument`, and
/// `System::InheritableFile::argument` \param confine    what to call before any component library
/// is loaded \return an exit status if the arguments are wrong; does not return otherwise
int runImportChild(const std::vector<std::string>& arguments, System::Confinement (*confine)());

} // namespace Mz::Tools

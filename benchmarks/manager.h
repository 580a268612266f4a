// SPDX-License-Identifier: BSL-1.0
/// The component manager of the measuring process.
#pragma once

#include "components/componentManager/componentImp.h"

#include <filesystem>

namespace Mz::Benchmarks {

/// The number of generated component libraries that the manager knows.
inline constexpr unsigned int builderCount = 1000;

/// Returns the folder of the generated libraries, which is made at the first call.
const std::filesystem::path& generatedFolder();

/// Returns the process-wide manager. The first call initialises it with `builderCount` generated
/// libraries of one builder each, and with the components that other benchmarks use.
QrComponentManager* initializedManager();

} // namespace Mz::Benchmarks

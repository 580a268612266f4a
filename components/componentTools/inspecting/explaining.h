// SPDX-License-Identifier: BSL-1.0
/// `explainFile` for callers that explain many files.
#pragma once

#include "components/componentTools/explain.h"
#include "components/componentTools/inspecting/interfaceDifference.h"

namespace Mz::Tools {

/// Returns what `explainFile(file, options)` returns, but compares the file with `host` instead of
/// `options.hosts`. Several threads may call it at once.
Explanation explainFile(const std::filesystem::path& file, const ExplainOptions& options,
                        const HostInterfaces& host);

} // namespace Mz::Tools

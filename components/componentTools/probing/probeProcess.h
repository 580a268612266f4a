// SPDX-License-Identifier: BSL-1.0
/// The process of `mzcomponents-probe`: its program, its limits, and the verdict on its end.
#pragma once

#include "components/componentTools/platform/system.h"
#include "components/componentTools/probe.h"
#include "components/componentTools/probing/probeAnswer.h"

#include <cstddef>
#include <cstdint>
#include <filesystem>

namespace Mz::Tools {

/// The limit of a report, in bytes. Real libraries stay far below it.
inline constexpr std::size_t longestAnswer = std::size_t{64} << 20;

/// Returns the program to run.
std::filesystem::path probeProgram(const ProbeOptions& options);

/// Returns the memory that the system enforces, in bytes. The system counts reserved addresses too,
/// so its limit is far above the real one.
std::uint64_t refusedMemory(const ProbeOptions& options);

/// Returns the verdict on a library from its report and from the end of its process.
Finding judgeEnd(const System::ChildResult& child, const ProbeAnswer& answer,
                 const ProbeOptions& options);

} // namespace Mz::Tools

// SPDX-License-Identifier: BSL-1.0
/// Loads a component library in a child process, which may crash or hang without harm.
///
/// The child process runs `mzcomponents-probe`, a program in the folder of libMZcomponentTools. It
/// loads one library, requests its description as the component manager does, and reports through a
/// pipe. The report is validated. Everything that the library itself writes to standard output and
/// standard error is discarded.
#pragma once

#include "components/componentTools/recordedList.h"
#include "components/componentTools/verdict.h"

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

namespace Mz::Tools {

/// The limits of the child process, and how it is started and interrupted.
struct ProbeOptions {
    /// The time that the library may take to load and describe itself. Then the process is killed.
    std::chrono::milliseconds timeLimit{10'000};
    /// The memory, in bytes, that the process may use. Then it is killed. Reserved but unused
    /// addresses do not count. The use is polled about a hundred times a second.
    std::uint64_t memoryLimit = std::uint64_t{1} << 30;
    /// The program to run; empty for `mzcomponents-probe` in the folder of libMZcomponentTools.
    std::filesystem::path program;
    /// A callback that is polled while the process runs; may be empty. If it returns true or
    /// throws, the process is killed; the exception is passed on to the caller.
    std::function<bool()> interrupted;
};

/// The result of `probeLibrary`.
struct ProbeResult {
    Finding verdict;                       ///< `works`, `offersNothing` or a fault
    std::vector<Finding> notes;            ///< findings on its builders
    std::wstring label;                    ///< of the component
    std::wstring text;                     ///< of the component
    std::vector<RecordedBuilder> builders; ///< empty unless the verdict is `works`
};

/// Loads the file in a child process and returns the verdict. Blocks until the process has ended.
///
/// The system also limits the process, far above `memoryLimit`, to stop a library that takes memory
/// faster than polling can notice. That limit includes reserved addresses, so a library may fail
/// only because of it. A library that may have is tried a second time without the system's limit,
/// and the second result counts.
/// \throws whatever `options.interrupted` throws
MZ_COMPONENT_TOOLS_API ProbeResult probeLibrary(const std::filesystem::path& file,
                                                const ProbeOptions& options = {});

} // namespace Mz::Tools

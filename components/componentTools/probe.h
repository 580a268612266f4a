/// Loading a component library in a process of its own, which may end as it likes.
///
/// The process runs `mzcomponents-probe`, a program that stands beside libMZcomponentTools. It
/// loads the one library, asks it for its description, as the component manager does, and answers
/// through a pipe. The answer is checked and never trusted; what the library itself writes goes
/// nowhere.
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

struct ProbeOptions {
    /// A library that takes longer to load and describe itself is killed.
    std::chrono::milliseconds timeLimit{10'000};
    /// So is one whose process uses more memory, in bytes: addresses that are only reserved do not
    /// count. Looked at some hundred times a second.
    std::uint64_t memoryLimit = std::uint64_t{1} << 30;
    /// The program to run; empty for the one beside libMZcomponentTools.
    std::filesystem::path program;
    /// Asked now and then; true ends the process, and so does an exception, which is passed on.
    /// Empty for never.
    std::function<bool()> interrupted;
};

struct ProbeResult {
    Finding verdict;                       ///< `works`, `offersNothing` or a fault
    std::vector<Finding> notes;            ///< about its builders
    std::wstring label, text;              ///< of the component
    std::vector<RecordedBuilder> builders; ///< empty unless the verdict is `works`
};

/// Loads the file in a new process and tells how that went. Blocks until it has ended.
///
/// The system refuses the process far more memory than `memoryLimit`, for what is taken faster than
/// it can be noticed. A library that fails may have failed for that alone, with reservations that
/// it never uses: it is tried once more without the refusal, and the second result counts.
MZ_COMPONENT_TOOLS_API ProbeResult probeLibrary(const std::filesystem::path& file,
                                                const ProbeOptions& options = {});

} // namespace Mz::Tools

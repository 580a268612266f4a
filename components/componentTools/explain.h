/// Why a file is, or is not, known to the component manager as a component library.
///
/// The manager says nothing about the files that it passes over. This does, in two depths: from the
/// outside, by reading the file; and by loading it in a process of its own, which may end as it
/// likes.
#pragma once

#include "components/componentTools/probe.h"
#include "components/componentTools/recordedList.h"
#include "components/componentTools/verdict.h"

#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools {

/// A library that the file needs, directly or through others.
struct Dependency {
    std::wstring name;     ///< as the one that needs it calls it
    std::wstring neededBy; ///< the file that needs it
    std::wstring path;     ///< where it is; empty when it is not a file of its own, or not found
    bool found = false;
};

struct Explanation {
    std::filesystem::path file; ///< the full path
    Finding verdict;            ///< the one that decides
    std::vector<Finding> notes; ///< what else is worth knowing, by its record and its builders
    std::vector<Dependency> dependencies;

    // What the library says of itself, after it was loaded without a fault.
    std::wstring label, text;
    std::vector<RecordedBuilder> builders;
};

struct ExplainOptions {
    /// A recorded list to look the file up in; null for none.
    const RecordedLibraries* recorded = nullptr;
    /// The folders of a host's search path, to say whether it leads to the file; null for none.
    const std::vector<std::filesystem::path>* folders = nullptr;
    /// Load the file in a process of its own, where it looks sound from the outside.
    bool load = false;
    ProbeOptions probe;
    /// The folder of the host's program, where the system looks for libraries too (Windows).
    std::filesystem::path programFolder;
    /// Ask the system for every library that is needed. Without it files are judged faster, and
    /// none is found to miss one.
    bool followDependencies = true;
};

/// Explains one file. Runs nothing of it in this process; of a file that shows a fault from the
/// outside, or is no component library, nothing is run at all.
///
/// Dependencies are judged as the loader would in this process. Where it is not sure of the
/// loader's rules (a library that describes its own surroundings), none counts as missing.
MZ_COMPONENT_TOOLS_API Explanation explainFile(const std::filesystem::path& file,
                                               const ExplainOptions& options = {});

} // namespace Mz::Tools

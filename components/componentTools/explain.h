// SPDX-License-Identifier: BSL-1.0
/// Explains why a file is, or is not, a component library for the component manager.
///
/// The manager skips files silently. `explainFile` reports the reason, in two depths: by reading
/// the file, and by loading it in a child process, which may crash or hang without harm.
#pragma once

#include "components/componentTools/dependency.h"
#include "components/componentTools/export.h"
#include "components/componentTools/probe.h"
#include "components/componentTools/recordedList.h"
#include "components/componentTools/verdict.h"

#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools {

/// The result of `explainFile`.
struct Explanation {
    std::filesystem::path file;           ///< the full path
    Finding verdict;                      ///< the most important finding
    std::vector<Finding> notes;           ///< findings on its record, its builders and its folder
    std::vector<Dependency> dependencies; ///< each name once, in the loader's order

    std::wstring label;                    ///< of the component; empty unless it was loaded
    std::wstring text;                     ///< of the component; empty unless it was loaded
    std::vector<RecordedBuilder> builders; ///< from the library if it was loaded, else its record
};

/// The options of `explainFile`.
struct ExplainOptions {
    /// A recorded list in which to look the file up; may be null.
    const RecordedLibraries* recorded = nullptr;
    /// The folders of a host's search path, to check whether the file is in one; may be null.
    /// Since 0.2.
    const std::vector<std::filesystem::path>* folders = nullptr;
    /// Load the file in a child process if reading it shows no fault. A missing dependency does not
    /// prevent the attempt.
    bool load = false;
    /// Limits and program of that process.
    ProbeOptions probe;
    /// The folder of the host's program, in which Windows looks for libraries too; empty for none.
    std::filesystem::path programFolder;
    /// Programs and libraries of the host, with whose interfaces those of the file are compared:
    /// see `otherInterface`. The program of this process and its libMZcomponentManager are compared
    /// in any case. Since 0.2.
    std::vector<std::filesystem::path> hosts;
    /// Look for every library that the file needs. If false, the check is faster, and
    /// `dependencyMissing` and `needsHost` are not found.
    bool followDependencies = true;
};

/// Explains one file.
///
/// No code of the file runs in this process. Code of the file runs in the child process only if
/// `options.load` is set, reading the file found a component library, its stamp does not name
/// another ABI (see `otherAbi`), its interfaces are those of the host (see `otherInterface`), and
/// it does not import from a program (see `needsHost`).
///
/// Dependencies are searched as the loader would search them in this process. If a library has a
/// manifest, which changes the loader's rules, none of its dependencies counts as missing.
/// \throws whatever `options.probe.interrupted` throws
MZ_COMPONENT_TOOLS_API Explanation explainFile(const std::filesystem::path& file,
                                               const ExplainOptions& options = {});

} // namespace Mz::Tools

// SPDX-License-Identifier: BSL-1.0
/// Lists the files of a search path that a component manager examines.
#pragma once

#include "components/componentTools/verdict.h"

#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools {

/// A file in a search folder, with the names under which it is recorded.
struct Candidate {
    std::filesystem::path path; ///< in the system's spelling
    std::wstring directory;     ///< normalised, as in the recorded list
    std::wstring fileName;      ///< normalised, as in the recorded list
};

/// The result of `discover`.
struct Discovery {
    std::vector<Candidate> candidates; ///< in the order in which the manager examines them

    /// A folder that cannot be searched, or a file whose name cannot be recorded.
    struct LeftOut {
        std::filesystem::path path; ///< of the folder or the file
        Finding finding;            ///< the reason
        bool folder = false;        ///< true for a search folder, false for a file in one
    };
    std::vector<LeftOut> leftOut; ///< what the manager cannot use
};

/// Returns the folders of a search path (separated by ';'), made absolute and without "." and "..".
/// Recorded names match only if the host passes folders in this form to its manager. Empty parts
/// are skipped.
MZ_COMPONENT_TOOLS_API std::vector<std::filesystem::path>
foldersOf(const std::filesystem::path& searchPath);

/// Returns the search path that consists of these folders. A folder is skipped if its name contains
/// ';' or cannot be encoded in the current locale.
MZ_COMPONENT_TOOLS_API std::wstring searchPathOf(const std::vector<std::filesystem::path>& folders);

/// Lists the candidates of the folders without reading them.
///
/// A file to which several folders or names lead is listed once. A folder that does not exist,
/// cannot be listed, or cannot be part of a search path is returned in `leftOut`.
MZ_COMPONENT_TOOLS_API Discovery discover(const std::vector<std::filesystem::path>& folders);

/// Returns the full path of `file` and the names under which it is recorded. A name that has no
/// form as text is empty. The file need not exist.
MZ_COMPONENT_TOOLS_API Candidate candidateOf(const std::filesystem::path& file);

/// Returns `path` as text for people. Bytes that are invalid in the locale appear as `\xNN`.
MZ_COMPONENT_TOOLS_API std::wstring displayName(const std::filesystem::path& path);

} // namespace Mz::Tools

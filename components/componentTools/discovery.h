/// Which files a component manager looks at.
#pragma once

#include "components/componentTools/verdict.h"

#include <filesystem>
#include <string>
#include <vector>

namespace Mz::Tools {

/// A file on a search path, in the order in which the manager comes to it.
struct Candidate {
    std::filesystem::path path; ///< as the system spells it
    std::wstring directory;     ///< normalised, as it is recorded
    std::wstring fileName;      ///< likewise
};

/// What a search path leads to.
struct Discovery {
    std::vector<Candidate> candidates;

    /// What cannot be searched, or cannot be recorded, for its name.
    struct LeftOut {
        std::filesystem::path path;
        Finding finding;
        bool folder = false; ///< one of those that were to be searched; else a file in one
    };
    std::vector<LeftOut> leftOut;
};

/// The folders of a search path (separated by ';'), each made absolute and free of "." and "..":
/// hosts must give the manager such names, and only then do recorded names match.
MZ_COMPONENT_TOOLS_API std::vector<std::filesystem::path>
foldersOf(const std::filesystem::path& searchPath);

/// The search path that leads a manager to these folders; those whose names the locale does not
/// carry, or have the separator in them, are left out.
MZ_COMPONENT_TOOLS_API std::wstring searchPathOf(const std::vector<std::filesystem::path>& folders);

/// Lists the candidate files of the folders. Nothing of them is read. A folder that does not exist,
/// or cannot be listed, or that no search path can lead to, is left out.
MZ_COMPONENT_TOOLS_API Discovery discover(const std::vector<std::filesystem::path>& folders);

/// The names under which a file is recorded.
MZ_COMPONENT_TOOLS_API Candidate candidateOf(const std::filesystem::path& file);

/// `path` for people, whatever it holds.
MZ_COMPONENT_TOOLS_API std::wstring displayName(const std::filesystem::path& path);

} // namespace Mz::Tools

// SPDX-License-Identifier: BSL-1.0
/// The files of a new project, made of the templates in the folder `templates`.
#pragma once

#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace Mz::Commands {

/// A template, as the build embeds it. `path` and `content` contain placeholders.
struct ProjectTemplate {
    std::string_view kind; ///< the kind of projects that it belongs to; "common" for all
    std::string_view path; ///< in the project, with '/'
    std::string_view content;
};

/// Returns all templates. The build writes this function.
std::span<const ProjectTemplate> projectTemplates();

/// What a project is made of.
struct Project {
    std::string kind; ///< component, importer or host
    std::string name; ///< an identifier of C++
    std::vector<std::string> extensions;
};

/// A file of a project.
struct ProjectFile {
    std::string path; ///< relative to the folder of the project, with '/'
    std::string content;
};

/// Returns the files of a new project, with new uids.
/// \throws std::logic_error  if a template contains an unknown placeholder
std::vector<ProjectFile> filesOf(const Project& project);

} // namespace Mz::Commands

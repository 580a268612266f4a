// SPDX-License-Identifier: BSL-1.0
/// A placeholder is a word between two '@'; in the path of a file, NAME and EXT are placeholders.
/// Every '@' must belong to a placeholder, so that a misspelt one cannot reach a user.
#include "tools/mzcomponents/project.h"

#include "tools/mzcomponents/randomUid.h"

#include <map>
#include <stdexcept>

namespace Mz::Commands {

namespace {

using Values = std::map<std::string, std::string, std::less<>>;

std::string capitalised(std::string name) {
    if (name.front() >= 'a' && name.front() <= 'z')
        name.front() = static_cast<char>(name.front() - 'a' + 'A');
    return name;
}

/// Returns "0.2" for "0.2.1": a project works with every patch of the release that it was made by.
std::string releaseOf(std::string_view version) {
    return std::string(version.substr(0, version.rfind('.')));
}

Values valuesOf(const Project& project) {
    std::string literals, patterns;
    for (const std::string& extension : project.extensions) {
        literals += (literals.empty() ? "L\"" : ", L\"") + extension + '"';
        patterns += (patterns.empty() ? "*." : ";*.") + extension;
    }
    return {{"NAME", project.name},
            {"Class", capitalised(project.name)},
            {"INTERFACE_UID", literalOf(randomUid())},
            {"BUILDER_UID", literalOf(randomUid())},
            {"EXTENSION", project.extensions.empty() ? "" : project.extensions.front()},
            {"EXTENSIONS", literals},
            {"PATTERNS", patterns},
            {"VERSION", releaseOf(MZ_VERSION)}};
}

std::string filledIn(std::string_view content, const Values& values) {
    std::string result;
    for (std::size_t begin = content.find('@'); begin != std::string_view::npos;
         begin = content.find('@')) {
        const std::size_t end = content.find('@', begin + 1);
        const std::string_view word = content.substr(begin + 1, end - begin - 1);
        const auto value = values.find(word);
        if (end == std::string_view::npos || value == values.end())
            throw std::logic_error("unknown placeholder in a template: @" +
                                   std::string(word.substr(0, 40)));
        result.append(content.substr(0, begin)).append(value->second);
        content.remove_prefix(end + 1);
    }
    return result.append(content);
}

std::string renamed(std::string path, std::string_view word, const std::string& value) {
    if (const std::size_t at = path.find(word); at != std::string::npos)
        path.replace(at, word.size(), value);
    return path;
}

} // namespace

std::vector<ProjectFile> filesOf(const Project& project) {
    const Values values = valuesOf(project);
    std::vector<ProjectFile> files;
    for (const ProjectTemplate& file : projectTemplates()) {
        if (file.kind != "common" && file.kind != project.kind)
            continue;
        // The extension first: the name may contain its placeholder, and not the other way round.
        std::string path = renamed(std::string(file.path), "EXT", values.at("EXTENSION"));
        files.push_back(
            {renamed(std::move(path), "NAME", project.name), filledIn(file.content, values)});
    }
    return files;
}

} // namespace Mz::Commands

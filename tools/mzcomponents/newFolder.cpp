// SPDX-License-Identifier: BSL-1.0
/// Writes in place, and not to a temporary folder that is renamed: the folder may exist and be the
/// current one. A list of what was created, in order, is removed in the reverse order.
#include "tools/mzcomponents/newFolder.h"

#include "tools/mzcomponents/output.h"

#include "components/componentManager/files.h"

#include <system_error>
#include <utility>

namespace Mz::Commands {

std::wstring obstacleToNew(const std::filesystem::path& folder) {
    // The folders above it that are missing are created, too.
    std::error_code ignored;
    std::filesystem::path present = folder;
    while (!std::filesystem::exists(std::filesystem::symlink_status(present, ignored)) &&
           present.has_relative_path())
        present = present.parent_path();
    if (!std::filesystem::is_directory(present, ignored))
        return shown(present) + L": this is a file, not a folder";
    if (present == folder && !std::filesystem::is_empty(folder))
        return shown(folder) + L": this folder is not empty, and nothing in it is overwritten";
    return {};
}

NewFolder::NewFolder(std::filesystem::path folder) : root(std::move(folder)) {}

NewFolder::~NewFolder() {
    remove();
}

void NewFolder::write(const std::filesystem::path& path, std::string_view content) {
    const std::filesystem::path file = root / path;
    createFolder(file.parent_path());
    replaceFile(file, content);
    created.push_back(file);
}

std::vector<std::filesystem::path> NewFolder::remove() {
    std::vector<std::filesystem::path> left;
    for (; !created.empty(); created.pop_back()) {
        std::error_code failure;
        if (!std::filesystem::remove(created.back(), failure) && failure)
            left.push_back(created.back());
    }
    return left;
}

void NewFolder::createFolder(const std::filesystem::path& path) {
    if (path.empty() || std::filesystem::is_directory(path))
        return;
    createFolder(path.parent_path());
    if (std::filesystem::create_directory(path))
        created.push_back(path);
}

} // namespace Mz::Commands

// SPDX-License-Identifier: BSL-1.0
/// Replaces files safely, and makes paths full.
///
/// The new content goes into a new file in the same folder, which is renamed at the end: renaming
/// is the one step that is atomic on all systems. The new file is on the medium before the rename.
/// Otherwise a crash could leave the new name without the content.
#include "components/componentManager/files.h"

#include "components/componentManager/exceptions.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/utf8.h"
#include "components/platform/files.h"

#include <fstream>
#include <optional>
#include <random>
#include <string>
#include <system_error>

namespace Mz {

namespace {

constexpr const char* source = "components/componentManager/files";

[[noreturn]] void failToOpen(int line, const std::filesystem::path& file,
                             const std::string& reason) {
    throw QrStreamEx::ExWriteOpen(source, line, utf8Name(file).c_str(), reason.c_str());
}

[[noreturn]] void failToWrite(int line, const std::filesystem::path& file) {
    throw QrStreamEx::ExWriteError(source, line, utf8Name(file).c_str());
}

/// Returns the file to which the chain of symlinks at `file` leads, which need not exist. Returns
/// `file` itself if it is not a symlink.
std::filesystem::path targetOf(const std::filesystem::path& file) {
    constexpr int maximumLinks = 40; // The limit of Linux.
    std::filesystem::path target = file;
    for (int count = 0; count < maximumLinks; ++count) {
        std::error_code failure;
        const auto text = platform::symlinkTarget(target, failure);
        if (failure)
            failToOpen(__LINE__, file, toUtf8(platform::errorText(failure)));
        if (!text)
            return target;
        target = target.parent_path() / *text; // An absolute target replaces the folder.
    }
    failToOpen(__LINE__, file, "its symlinks form a loop");
}

/// A new file in the folder of the target of `file`. The destructor removes it, unless it has
/// replaced the target.
class NewFile {
  public:
    explicit NewFile(const std::filesystem::path& file) : file(file), target(targetOf(file)) {
        std::error_code failure;
        old = std::filesystem::status(target, failure);
        if (!std::filesystem::status_known(old)) // Its permissions could not be kept.
            failToOpen(__LINE__, file, toUtf8(platform::errorText(failure)));
        if (std::filesystem::exists(old) && !std::filesystem::is_regular_file(old))
            failToOpen(__LINE__, file, "it is not a regular file");
        // This process must write and read the file, whatever its final permissions are.
        constexpr auto ownerAccess =
            std::filesystem::perms::owner_read | std::filesystem::perms::owner_write;
        const auto permissions =
            replaces() ? old.permissions() | ownerAccess : std::filesystem::perms(0666);
        std::random_device random;
        do {
            path = target;
            path += ".saving-" + std::to_string(random());
            failure = platform::createNew(path, permissions);
        } while (failure == std::errc::file_exists);
        if (failure)
            failToOpen(__LINE__, file, toUtf8(platform::errorText(failure)));
    }
    ~NewFile() {
        std::error_code ignored;
        if (!path.empty())
            std::filesystem::remove(path, ignored);
    }
    NewFile(const NewFile&) = delete;
    NewFile& operator=(const NewFile&) = delete;

    void fill(const std::function<void(std::ostream&)>& write) {
        std::ofstream stream(path, std::ios::binary);
        if (stream)
            write(stream);
        stream.exceptions(std::ios::goodbit);
        stream.close();
        if (!stream)
            failToWrite(__LINE__, file);
    }

    void replaceTarget() {
        const auto permissions = replaces() ? std::optional(old.permissions()) : std::nullopt;
        if (platform::syncFile(path, permissions))
            failToWrite(__LINE__, file);
        if (const std::error_code failure = platform::moveOver(path, target))
            failToOpen(__LINE__, file, toUtf8(platform::errorText(failure)));
        path.clear();
    }

  private:
    bool replaces() const { return std::filesystem::is_regular_file(old); }

    const std::filesystem::path& file;
    std::filesystem::path target;
    std::filesystem::file_status old;
    std::filesystem::path path;
};

} // namespace

void replaceFile(const std::filesystem::path& file,
                 const std::function<void(std::ostream&)>& write) {
    NewFile replacement(file);
    replacement.fill(write);
    replacement.replaceTarget();
}

void replaceFile(const std::filesystem::path& file, std::string_view content) {
    replaceFile(file, [&](std::ostream& stream) {
        stream.write(content.data(), static_cast<std::streamsize>(content.size()));
    });
}

std::filesystem::path programFolder() {
    return platform::programFile().parent_path();
}

std::optional<std::filesystem::path> environmentPath(const char* name) {
    return platform::environmentPath(name);
}

std::filesystem::path fullPath(const std::filesystem::path& path) {
    std::filesystem::path full = platform::resolveDots(std::filesystem::absolute(path));
    if (!full.has_filename() && full.has_relative_path())
        full = full.parent_path();
    full.make_preferred();
    return full;
}

} // namespace Mz

// SPDX-License-Identifier: BSL-1.0
/// The host: imports all entries of an archive, none of which is a file. Entries that other entries
/// refer to come from the archive, too: the controller of the host finds them there, and hands out
/// copies in a temporary folder.
#include "note.h"
#include "zipArchive.h"

#include "components/componentKit/hostKit.h"

#include <cstdlib>
#include <fstream>
#include <iostream>
#include <map>
#include <system_error>

using namespace Mz;

namespace {

/// No entry may be larger.
constexpr std::size_t mostBytes = 1'000'000;

/// A folder that only this user can read, removed with its content in the end.
class TemporaryFolder {
  public:
    TemporaryFolder() {
        std::string name = (std::filesystem::temp_directory_path() / "archive-XXXXXX").string();
        if (!mkdtemp(name.data()))
            throw std::system_error(errno, std::generic_category(), name);
        folder = name;
    }
    ~TemporaryFolder() {
        std::error_code ignored;
        std::filesystem::remove_all(folder, ignored);
    }
    TemporaryFolder(const TemporaryFolder&) = delete;
    TemporaryFolder& operator=(const TemporaryFolder&) = delete;

    const std::filesystem::path& path() const { return folder; }

  private:
    std::filesystem::path folder;
};

/// Finds the entries of an archive, and nothing else.
class ArchiveController final : public Kit::Controller {
  public:
    explicit ArchiveController(const ZipArchive& opened) : archive(opened) {}

    /// Returns the name of a copy of the entry `name`. Names of entries never become names of
    /// files: an entry can be called "../../.profile".
    std::wstring findFile(const wchar_t* name, const wchar_t*, const wchar_t*) override {
        const std::string entry = toNarrow(name, '?');
        if (const auto known = copies.find(entry); known != copies.end())
            return known->second;
        try {
            const std::optional<std::string> bytes = archive.content(entry, mostBytes);
            if (!bytes)
                return {};
            const auto file = folder.path() / std::to_string(copies.size());
            std::ofstream(file, std::ios::binary) << *bytes;
            return copies[entry] = Kit::wideName(file);
        } catch (const ZipError& failure) {
            warning(0, displayText(entry + ": " + failure.what()).c_str());
            return {};
        }
    }

  private:
    const ZipArchive& archive;
    TemporaryFolder folder;
    std::map<std::string, std::wstring> copies;
};

void importEntry(const ZipArchive& archive, const std::string& name) {
    try {
        const std::string bytes = archive.content(name, mostBytes).value_or("");
        const auto result = Kit::importFrom(noteBuilders, bytes, displayText(name));
        if (const auto note = queryCast<Note>(result.object.get()))
            std::cout << name << ": \"" << note->title() << "\"\n" << note->text();
        else
            std::cout << toNarrow(Kit::describe(result), '?') << '\n';
    } catch (const ZipError& failure) {
        std::cout << name << ": " << failure.what() << '\n';
    }
}

} // namespace

int main(int argc, char** argv) {
    Kit::initialize(Kit::programFolder() / "components");
    if (argc != 2)
        return std::cerr << "usage: archiveHost ARCHIVE\n", 2;
    try {
        const ZipArchive archive(argv[1]);
        ArchiveController controller(archive);
        const Kit::ControllerScope installed(controller);
        for (const std::string& name : archive.names())
            importEntry(archive, name);
        return 0;
    } catch (const std::exception& failure) {
        std::cerr << argv[1] << ": " << failure.what() << '\n';
        return 1;
    }
}

/// What the library needs of the operating system: one description, and one implementation for each
/// system (`windows/`, `posix/`), chosen by the build. No other file knows which system it is on.
///
/// Every function may be called from any thread; those that touch one library at a time say so. No
/// function throws anything but `std::bad_alloc`.
#pragma once

#include <cstdint>
#include <filesystem>
#include <fstream>
#include <optional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace Mz::platform {

// ---- Names ----------------------------------------------------------------------------------

/// A name as the system wants it, in bytes or wide characters.
using NativePath = std::filesystem::path::string_type;

/// `name` as the system wants it; nothing when the current locale has no form for it. On Linux
/// characters become bytes as buffered IO writes them.
std::optional<NativePath> toNative(std::wstring_view name);

/// The name by which to open what was found as `found` and is stored as `directory`, and `name` in
/// it unless that is empty: the stored names where letter case and the kind of separator make no
/// difference, else the found one.
NativePath openingPath(const std::wstring& directory, const std::wstring& name,
                       const NativePath& found);

/// `text` in lower case, as file names are compared: by the C runtime's rules on Windows, ASCII
/// letters only on Linux.
std::wstring lowerCase(std::wstring text);

/// Returns whether names that differ in letter case only stand for one file.
bool namesIgnoreCase();

/// The first element of the process's command line, by which the program was started; nothing when
/// the system does not tell, or the current locale has no form for it.
std::optional<std::wstring> firstArgument();

// ---- Files ----------------------------------------------------------------------------------

/// Which file a name stands for, whatever the name. Some file systems give two files the same
/// identity, so ask `isSameFile` before you believe it.
struct FileIdentity {
    std::uint64_t device = 0;
    std::uint64_t index = 0;
    // The check takes the comparison with zero inside it for a null pointer.
    // NOLINTNEXTLINE(modernize-use-nullptr)
    friend auto operator<=>(const FileIdentity&, const FileIdentity&) = default;
};

struct FileStatus {
    std::uint32_t time = 0; ///< last modification, seconds since 1970, cut to 32 bits
    long long size = 0;     ///< in bytes
    bool regular = false;   ///< a regular file, or a link to one
};

/// The status of the file, links followed, from one query; nothing when there is none to be had.
std::optional<FileStatus> queryFile(const NativePath& path);

/// Whether two names, neither of which may be a folder's, stand for one file.
bool isSameFile(const NativePath& a, const NativePath& b);

/// One file that may be a component library.
struct DirectoryEntry {
    std::wstring name;                    ///< as the system spells it
    NativePath path;                      ///< the directory as it was given, and the name
    std::optional<FileIdentity> identity; ///< where the system allows two names for one file
};

/// Returns, for each directory, its regular files that are not hidden (by attribute, or by a
/// leading dot where that is the custom) and no system files. A directory that cannot be listed has
/// none; a name that cannot be converted is left out.
///
/// The files of a directory are in the order in which NTFS lists them: on Windows the system's own;
/// on Linux by UTF-16 code units, letters as upper case by a fixed table, ties by the bytes of the
/// names.
///
/// The identities are comparable among all these directories: names of one file have the same.
std::vector<std::vector<DirectoryEntry>> listCandidates(const std::vector<NativePath>& directories);

/// Returns the candidates of one directory.
inline std::vector<DirectoryEntry> listCandidates(const NativePath& directory) {
    return std::move(listCandidates(std::vector<NativePath>{directory}).front());
}

/// Opens `path` for reading in binary, denying nothing to other openers. False when it cannot be
/// opened or is a directory; the stream is then not good.
bool openForReading(std::ifstream& stream, const NativePath& path);

// ---- Libraries ------------------------------------------------------------------------------

/// A loaded library.
using Module = void*;

/// The library if the process has it mapped under this path already, else null. Takes no reference:
/// it stays as long as whoever loaded it wants.
Module findLoadedLibrary(const NativePath& path);

/// What the file says of a function.
enum class ExportState {
    absent,   ///< the file does not export it, is no library, is damaged or cannot be opened
    exported, ///< the file is a library that exports the function
    unknown,  ///< the system had no resources left to open the file
};

/// Returns whether the file is a library for this system and processor that exports the function
/// `symbol` itself. Runs nothing of the file, not even its initialisers. A bounded reader of the
/// file's own tables decides first, so that a damaged file, a program or a library without the
/// function is not even mapped.
ExportState queryExport(const NativePath& path, const char* symbol);

/// Returns whether `queryExport` finds the function.
inline bool exportsFunction(const NativePath& path, const char* symbol) {
    return queryExport(path, symbol) == ExportState::exported;
}

/// Loads the library, with its own surroundings where the system knows such (the manifest in it);
/// null when it cannot be loaded.
Module loadLibrary(const NativePath& path);

/// The result of `useLibrary`.
struct UsedLibrary {
    Module module = nullptr; ///< null if there is no such library
    bool loaded = false;     ///< by this call; the caller must unload it
    /// The system had no resources left to open the file: with a null module, there may be a
    /// library all the same.
    bool unknown = false;
};

/// Returns the library that the process has mapped under this path already, whatever it exports.
/// Otherwise loads the one in the file if it exports the function `symbol`. Runs nothing of a file
/// that does not export the symbol.
UsedLibrary useLibrary(const NativePath& path, const char* symbol);

/// Gives back one load.
void unloadLibrary(Module module);

/// Keeps the library that contains this code, the component manager's, loaded until the process
/// ends. Components depend on that library, and its destructor unloads them: without a reference of
/// its own, it would be unmapped with the last component, while its destructor runs. A no-op in a
/// program, and where the loader unmaps nothing while a process ends.
void keepOwnLibrary();

/// The address of the function `symbol` in that very library, not in one it depends on; null when
/// it has none, when that is no code, and when `module` is null.
void* findSymbol(Module module, const char* symbol);

/// Keeps the system from showing dialogs to the user, for as long as it lives, on loads that fail.
class QuietErrors {
  public:
    QuietErrors();
    ~QuietErrors();
    QuietErrors(const QuietErrors&) = delete;
    QuietErrors& operator=(const QuietErrors&) = delete;

  private:
    [[maybe_unused]] unsigned int previousMode; ///< where the system has such a mode
};

// ---- Threads and locale ---------------------------------------------------------------------

/// The system's identifier of the calling thread. The system may give it to another thread when
/// this one has ended.
std::uint32_t currentThreadId();

/// Has `before` called before the process makes a copy of itself, and afterwards `inParent` in the
/// process and `inChild` in the copy, where only the calling thread lives on, by another
/// identifier. Does nothing where processes make no copies of themselves.
void aroundForks(void (*before)(), void (*inParent)(), void (*inChild)());

/// Whether LC_CTYPE of the calling thread is "C" or "POSIX".
bool usesPlainBytes();

/// What the users of `CLocale` in one process share. The platform layer keeps no state, so its user
/// provides one object for the whole process, which must outlive every `CLocale` made with it.
struct LocaleSwitch {
    LocaleSwitch();

    void* plain = nullptr; ///< the "C" locale, where the system has handles for locales
    void* lock = nullptr;  ///< the system's lock, which guards what follows; null is unlocked
    int wanted = 0;        ///< how many `CLocale` live
    std::wstring previous; ///< the locale to restore; empty while none lives
};

/// While it lives, the C locale appears as "C" to the calling thread. May be nested.
///
/// Where the system knows locales of threads (Linux), no other thread notices. Elsewhere (Windows)
/// the locale of the process is switched, by the first that comes, and restored by the last that
/// goes, whichever threads they are: other threads see "C" meanwhile, and a locale that somebody
/// else sets meanwhile is lost. Nothing is switched where it is "C" already.
class CLocale {
  public:
    explicit CLocale(LocaleSwitch& shared);
    ~CLocale();
    CLocale(const CLocale&) = delete;
    CLocale& operator=(const CLocale&) = delete;

  private:
    [[maybe_unused]] LocaleSwitch& shared;
    [[maybe_unused]] void* previous = nullptr; ///< where the system has handles for locales
};

} // namespace Mz::platform

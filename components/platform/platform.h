// SPDX-License-Identifier: BSL-1.0
/// What the library needs from the operating system. Each system has its own implementation
/// (`windows/`, `posix/`), which the build selects. No other file depends on the system.
///
/// All functions may be called from any thread and throw `std::bad_alloc` only.
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

/// A file name as the system spells it: bytes on Linux, wide text on Windows.
using NativePath = std::filesystem::path::string_type;

/// Returns `name` as the system spells it; `std::nullopt` if the current locale cannot represent
/// it. On Linux the characters are converted as buffered IO converts text.
std::optional<NativePath> toNative(std::wstring_view name);

/// Returns the path by which to open a directory, or a file in it.
///
/// Where letter case and the kind of separator do not matter (Windows), that is the normalised
/// path; elsewhere it is the path as it was found.
///
/// \param directory  the normalised directory
/// \param name  the normalised name of the file; empty for the directory itself
/// \param found  the path as it was found
NativePath openingPath(std::wstring_view directory, std::wstring_view name,
                       const NativePath& found);

/// Returns `text` in lower case, for the comparison of file names: by the rules of the C runtime on
/// Windows, for ASCII letters only on Linux.
std::wstring lowerCase(std::wstring text);

/// Returns whether names that differ only in letter case refer to the same file.
bool namesIgnoreCase();

/// Returns the first element of the process's command line, usually the name by which the program
/// was started; `std::nullopt` if it is not available or has no wide form in the current locale.
std::optional<std::wstring> firstArgument();

// ---- Files ----------------------------------------------------------------------------------

/// The identity of a file, independent of its names. Some file systems assign the same identity to
/// two files, so confirm a match with `isSameFile`.
struct FileIdentity {
    std::uint64_t device = 0;
    std::uint64_t index = 0;
    // clang-tidy mistakes the zero in the defaulted comparison for a null pointer.
    // NOLINTNEXTLINE(modernize-use-nullptr)
    friend auto operator<=>(const FileIdentity&, const FileIdentity&) = default;
};

/// The status of a file.
struct FileStatus {
    std::uint32_t time = 0; ///< last modification, seconds since 1970, truncated to 32 bits
    long long size = 0;     ///< in bytes
    bool regular = false;   ///< a regular file, or a symlink to one
};

/// Returns the status of the file, from one query that follows symlinks; `std::nullopt` if the
/// query fails.
/// \param unknown  receives whether the query failed because the system lacked resources or could
/// not
///     read the medium now; may be null. Always false on Windows
std::optional<FileStatus> queryFile(const NativePath& path, bool* unknown = nullptr);

/// Returns whether two paths refer to the same file. Neither may be the path of a directory.
bool isSameFile(const NativePath& a, const NativePath& b);

/// A candidate: a file that may be a component library.
struct DirectoryEntry {
    std::wstring name;                    ///< as the system spells it
    NativePath path;                      ///< the directory as it was passed, and the name
    std::optional<FileIdentity> identity; ///< on systems where this file may have several names
};

/// Returns the candidates of each directory: its regular files that are neither hidden (by
/// attribute on Windows, by a leading dot on Linux) nor system files. A directory that cannot be
/// listed has no candidates. A file whose name cannot be converted is skipped.
///
/// The files of a directory are in the order in which NTFS lists them. On Windows that is the order
/// of the system. On Linux they are sorted by UTF-16 code units, with letters in upper case by a
/// fixed table; names that are equal then are sorted by their bytes.
///
/// All identities in the result are comparable: several names of one file have the same identity.
///
/// \param unlisted  receives for each directory whether candidates may be missing because the
/// system
///     lacked resources or could not read the directory now; may be null. Always false on Windows
std::vector<std::vector<DirectoryEntry>> listCandidates(const std::vector<NativePath>& directories,
                                                        std::vector<bool>* unlisted = nullptr);

/// Returns the candidates of one directory.
inline std::vector<DirectoryEntry> listCandidates(const NativePath& directory) {
    return std::move(listCandidates(std::vector<NativePath>{directory}).front());
}

/// Opens `path` for binary reading, without denying access to other programs.
///
/// \return whether the stream is good; false if the file cannot be opened or is a directory
bool openForReading(std::ifstream& stream, const NativePath& path);

// ---- Libraries ------------------------------------------------------------------------------

/// A loaded library.
using Module = void*;

/// Returns the library if the process has already mapped it under this path, else null. Takes no
/// reference: the library stays loaded until the code that loaded it unloads it.
Module findLoadedLibrary(const NativePath& path);

/// Whether a file exports a function.
enum class ExportState {
    absent,   ///< the file does not export it, is not a library, is damaged, or may not be opened
    exported, ///< the file is a library that exports the function
    unknown,  ///< the system lacked resources, or could not read the file now
};

/// Returns whether the file is a library for this system and processor that exports the function
/// `symbol` itself. Runs no code of the file, not even its initialisers. A bounded reader checks
/// the tables in the file first, so that a damaged file, a program or a library without the
/// function is not mapped.
ExportState queryExport(const NativePath& path, const char* symbol);

/// Returns whether the result of `queryExport` is `exported`.
inline bool exportsFunction(const NativePath& path, const char* symbol) {
    return queryExport(path, symbol) == ExportState::exported;
}

/// Loads the library and returns it; null if it cannot be loaded. On Windows the manifest in the
/// library is active while it loads. The caller must unload the library.
Module loadLibrary(const NativePath& path);

/// The result of `useLibrary`.
struct UsedLibrary {
    Module module = nullptr; ///< null if there is no such library
    bool loaded = false;     ///< whether this call loaded it; then the caller must unload it
    /// The system lacked resources, or could not read the file now. If the module is null, the file
    /// may be a library nevertheless.
    bool unknown = false;
};

/// Returns the library that the process has already mapped under this path, whatever it exports.
/// Otherwise loads the file if it exports the function `symbol`. Runs no code of a file that does
/// not export the function.
UsedLibrary useLibrary(const NativePath& path, const char* symbol);

/// Unloads a library: releases one reference that a load took. A no-op for null.
void unloadLibrary(Module module);

/// Keeps the library that contains this code (the component manager's) loaded until the process
/// ends. Components depend on that library, and its destructor unloads them. Without this reference
/// it would be unmapped with the last component, while its destructor runs. A no-op in a program,
/// and on Windows, where the loader unmaps nothing while a process ends.
void pinThisLibrary();

/// Returns the address of the function `symbol` in the library itself, not in a dependency; null if
/// the library does not export it, if the address is not in code, or if `module` is null.
void* findSymbol(Module module, const char* symbol);

/// Prevents the system from showing dialogs when a load fails, during the lifetime of the object.
class QuietErrors {
  public:
    QuietErrors();
    ~QuietErrors();
    QuietErrors(const QuietErrors&) = delete;
    QuietErrors& operator=(const QuietErrors&) = delete;

  private:
    [[maybe_unused]] unsigned int previousMode; ///< the process's error mode, on Windows
};

// ---- Threads and locale ---------------------------------------------------------------------

/// Returns the system's identifier of the calling thread. The system may reuse it after the thread
/// has ended.
std::uint32_t currentThreadId();

/// Registers handlers for `fork()`: `before` is called before it, then `inParent` in the parent and
/// `inChild` in the child. The child has only the thread that called `fork()`, under a new
/// identifier. A no-op on Windows, which has no `fork()`.
void aroundForks(void (*before)(), void (*inParent)(), void (*inChild)());

/// Returns whether LC_CTYPE of the calling thread is "C" or "POSIX".
bool usesPlainBytes();

/// The state that all `CLocale` objects of one process share. The platform layer has no state, so
/// its user provides one object for the whole process, which must outlive all these `CLocale`.
struct LocaleSwitch {
    LocaleSwitch();

    void* plain = nullptr; ///< the "C" locale, where the system has handles for locales
    void* lock = nullptr;  ///< the system's lock, which guards the next members; null is unlocked
    int useCount = 0;      ///< the number of `CLocale` objects
    std::wstring previous; ///< the locale to restore; empty while there is no `CLocale`
};

/// Sets the C locale of the calling thread to "C" during its lifetime. May be nested.
///
/// On Linux threads have their own locales, and no other thread is affected. On Windows the first
/// object sets the locale of the process, and the last one restores it, whatever their threads.
/// Meanwhile other threads see "C", too, and a locale that other code sets is lost. If the locale
/// is already "C", it is not set.
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

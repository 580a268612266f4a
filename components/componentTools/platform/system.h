// SPDX-License-Identifier: BSL-1.0
/// The operating system functions of the tools, in addition to the component manager's platform
/// layer. Each system has an implementation (`windows/`, `posix/`), which the build selects. No
/// other file of the tools depends on the system.
///
/// Functions throw `std::bad_alloc` only, unless their comments name other exceptions.
#pragma once

#include "components/componentTools/images/libraryImage.h"

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <fstream>
#include <functional>
#include <optional>
#include <string>
#include <utility>
#include <vector>

namespace Mz::Tools::System {

using NativePath = std::filesystem::path;

// ---- Names ----------------------------------------------------------------------------------

/// Returns `path` as text for people. Bytes that are invalid in the locale appear as `\xNN`.
std::wstring displayName(const NativePath& path);

/// Returns `text` as bytes for standard output (`stream` 1) or standard error (2). The encoding is
/// the terminal's if the stream is one, else the locale's. A character that cannot be encoded
/// becomes '?'.
std::string encode(const std::wstring& text, int stream);

/// Returns the arguments of this process without the program's name: the original bytes on Linux,
/// UTF-8 on Windows.
std::vector<std::string> arguments(int count, char** values);

/// Returns the path that an argument from `arguments` names.
NativePath pathOfArgument(const std::string& argument);

// ---- Files and libraries --------------------------------------------------------------------

/// Returns the format of this system's libraries.
ImageFormat ownFormat();

struct FileAttributes {
    bool hidden = false, system = false, directory = false;
};
/// Returns the attributes of a file. If there is none, only `hidden` may be set.
FileAttributes fileAttributes(const NativePath& path);

/// Returns the folder that has this normalised name; `std::nullopt` if there is none. Where letter
/// case matters, it searches each folder on the way for a name that equals it except for case; a
/// name in lower case comes first.
std::optional<NativePath> findFolder(const std::wstring& normalised);

/// Returns the name of the environment variable that adds folders to the loader's search path.
const wchar_t* loaderPathVariable();

/// The result of `findDependency`.
struct Located {
    bool found = false;
    NativePath file; ///< valid only if `found`; empty if the library has no file
};

/// A library with dependencies, and the library that loads it.
struct Needer {
    NativePath library;
    LibraryImage image;
    const Needer* loader = nullptr; ///< null for the first library
};

/// Searches for the library `name` as the loader would in this process.
/// \param needer         the library that needs it
/// \param programFolder  the folder of the host's program; may be empty; unused on Linux
Located findDependency(const std::string& name, const Needer& needer,
                       const NativePath& programFolder);

/// Returns the loader's error for `path`, which has just failed to load. Tries to load it again.
std::wstring loaderError(const NativePath& path);

/// Returns the folder of libMZcomponentTools; empty if the system does not know it.
NativePath moduleFolder();

/// Returns the file of the libMZcomponentManager of this process; empty if the system does not know
/// it.
NativePath managerFile();

/// Returns the path of a program that is found in the folders of PATH that have full paths; empty
/// if there is none. \param name  the program's name, on Windows with or without ".exe"
NativePath findProgram(const std::string& name);

/// Returns the extension of programs; empty on Linux.
const char* programExtension();

// ---- Child processes ------------------------------------------------------------------------

struct ChildLimits {
    std::chrono::milliseconds time;
    std::uint64_t memory;              ///< used memory, in bytes; polled
    std::uint64_t refused;             ///< memory that the system enforces, in bytes; 0 for none
    std::size_t output;                ///< in bytes
    std::function<bool()> interrupted; ///< polled; true kills the child; may be empty
    /// Whether `time` is the limit between two pieces of output instead of that of the whole run.
    bool outputRestartsTime = false;
    /// Receives the output after each new piece, and may remove what it has used; may be empty.
    std::function<void(std::string&)> received = {};
    /// Polled after each piece of output; true ends the child, which is not needed any more; may be
    /// empty.
    std::function<bool()> complete = {};
    /// Environment variables of the child in addition to those of this process, by ASCII names.
    std::vector<std::pair<std::string, NativePath>> environment = {};
};

/// A file that is open for reading, and that a child can inherit.
class InheritableFile {
  public:
    /// Opens a regular file, without denying any access to other openers.
    explicit InheritableFile(const NativePath& path);
    ~InheritableFile();
    InheritableFile(const InheritableFile&) = delete;
    InheritableFile& operator=(const InheritableFile&) = delete;

    /// Returns whether the file was opened.
    bool isOpen() const;
    /// Returns the argument of the child for `takeInheritedFile`.
    std::string argument() const;
    std::intptr_t number() const { return handle; }

  private:
    std::intptr_t handle = -1;
};

/// What a child gets besides its arguments.
struct ChildSupply {
    /// The bytes for its standard input, which are removed as they are sent; callbacks of
    /// `ChildLimits` may append more. The child never blocks this process. Null for an empty
    /// standard input.
    std::string* input = nullptr;
    const InheritableFile* file = nullptr; ///< an open file; may be null
};

struct ChildResult {
    enum class End {
        notStarted,
        exited,
        crashed, ///< ended by a signal (Linux) or a fault (Windows)
        timedOut,
        outOfMemory,
        tooMuchOutput,
        interrupted,
        complete, ///< ended because `ChildLimits::complete` returned true
        unknown,  ///< not available, because this process ignores SIGCHLD
    };
    End end = End::notStarted;
    int status = 0;           ///< the exit status, if it exited
    std::wstring detail;      ///< the name of the crash, or why the child was not started
    std::string output;       ///< its standard output
    std::uint64_t memory = 0; ///< the peak of its used memory, in bytes
};

/// Runs a program with discarded standard error, and waits for its end. If it exceeds a limit,
/// kills it and the processes that it started. \throws whatever the callbacks in `limits` throw,
/// after it has killed the program
ChildResult runChild(const NativePath& program, const std::vector<NativePath>& arguments,
                     const ChildLimits& limits, const ChildSupply& supply = {});

/// The pipe of a probe to the process that started it.
///
/// The constructor takes over standard output, and redirects standard output and standard error to
/// the null device, so that other output cannot mix with the messages. On Linux it closes all other
/// inherited files, except the one of `ChildSupply::file` if it is kept.
class AnswerPipe {
  public:
    explicit AnswerPipe(bool keepsFile = false);
    /// Writes all bytes; ignores failures. May be called from a signal handler.
    void write(const char* data, std::size_t size);

  private:
    std::intptr_t handle;
};

/// The pipe from the process that started this one, on `ChildSupply::input`.
///
/// The constructor takes over standard input, and redirects it to the null device.
class InputPipe {
  public:
    InputPipe();
    /// Reads up to `size` bytes; waits for the first one. Returns 0 at the end and on failure.
    std::size_t read(char* data, std::size_t size);

  private:
    std::intptr_t handle;
};

/// Opens `stream` on the file that this process inherited. It is the standard file buffer, so reads
/// are as fast as from a file that was opened by name.
/// \param argument  the result of `InheritableFile::argument`
/// \return whether there is such a file
bool takeInheritedFile(const std::string& argument, std::ifstream& stream);

/// Redirects standard output to standard error, for all other code in this process.
/// \return a descriptor of the original standard output, for `writeReserved`; -1 if it was closed
int reserveOutput();

/// Writes all bytes, with the line ends of standard output. Returns false on failure.
bool writeReserved(int descriptor, const char* data, std::size_t size);

/// Resets SIGCHLD to its default, so that the exit status of children is available. The parent
/// process may have ignored it. No-op on Windows.
void resetChildSignal();

/// Blocks all signals of the calling thread but those of faults, until it is destroyed. Threads
/// that are started meanwhile keep them blocked to their end. No-op on Windows.
class BlockedSignals {
  public:
    BlockedSignals();
    ~BlockedSignals();
    BlockedSignals(const BlockedSignals&) = delete;
    BlockedSignals& operator=(const BlockedSignals&) = delete;

  private:
    [[maybe_unused]] std::uint64_t previous = 0; ///< one bit for each signal
};

/// Prepares this process for loading faulty libraries: it ends with its parent, opens no dialogs,
/// leaves no core dump, and gets at most `refused` bytes of memory, unless that is 0. Writable
/// reserved addresses count. On Windows, `runChild` enforces the memory limit and the end with the
/// parent, by a job.
void confine(std::uint64_t refused);

/// Ends this process at once, without running exit handlers or destructors.
[[noreturn]] void endProcess(int status);

/// Returns the name of the last fault that an exception handler in this process caught; empty if
/// there was none. Windows catches crashes in the initialisers of libraries. Empty on Linux.
std::wstring caughtFault();

/// A file that this process has created and holds: other code, in this process or another, sees
/// that it is held, until the object is destroyed or the process ends. The file stays then, unless
/// `remove` was called.
class HeldFile {
  public:
    HeldFile() = default;
    ~HeldFile();
    HeldFile(const HeldFile&) = delete;
    HeldFile& operator=(const HeldFile&) = delete;

    /// Creates the file, in place of one that is not held. Returns false on failure.
    bool create(const NativePath& file);
    /// Replaces the content. Returns false on failure.
    bool write(const std::string& content);
    /// Deletes the file. No-op if there is none.
    void remove();

  private:
    NativePath path;
    std::intptr_t handle = -1;
};

/// Returns whether a `HeldFile` exists for the file, in any process.
bool isHeld(const NativePath& file);

/// Returns the id of this process.
unsigned long processNumber();

} // namespace Mz::Tools::System

/// What the tools need of the operating system beyond what the component manager's own layer gives:
/// one description, and one implementation for each system (`windows/`, `posix/`), chosen by the
/// build. No other file of the tools knows which system it is on.
///
/// No function throws anything but `std::bad_alloc`, where nothing else is said.
#pragma once

#include "components/componentTools/libraryImage.h"

#include <chrono>
#include <cstdint>
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

namespace Mz::Tools::System {

using NativePath = std::filesystem::path;

// ---- Names ----------------------------------------------------------------------------------

/// `path` for people: what has no form in the current locale is shown as `\xNN`.
std::wstring displayName(const NativePath& path);

/// `text` as bytes for standard output or standard error: in the terminal's encoding where `stream`
/// (1 or 2) is one, else in that of the locale; '?' for what has no form there.
std::string encode(const std::wstring& text, int stream);

/// The arguments of this process without its name, in bytes: those of the system where names are
/// bytes, else UTF-8.
std::vector<std::string> arguments(int count, char** values);

/// The path that such an argument names.
NativePath pathOfArgument(const std::string& argument);

// ---- Files and libraries --------------------------------------------------------------------

/// The format of this system's own libraries.
ImageFormat ownFormat();

struct FileAttributes {
    bool hidden = false, system = false, directory = false;
};
FileAttributes fileAttributes(const NativePath& path);

/// The environment variable that adds folders to those where the system looks for libraries.
const wchar_t* loaderPathVariable();

/// Where the system would find a library that another one needs.
struct Located {
    bool found = false;
    NativePath file; ///< empty when it is found without a file of its own
};

/// A library that needs others, and the one through which it was found to be needed itself.
struct Needer {
    NativePath library;
    LibraryImage image;
    const Needer* loader = nullptr; ///< null for the one that everything began with
};

/// Looks for the library `name` that `needer` needs, as the loader would in this process;
/// `programFolder`, unless empty, stands for the folder of the host's program where that matters.
Located findDependency(const std::string& name, const Needer& needer,
                       const NativePath& programFolder);

/// What the loader says to `path`, which it has just failed to load.
std::wstring loaderWords(const NativePath& path);

/// The folder of libMZcomponentTools itself; empty when the system does not tell.
NativePath ownFolder();

/// The program with that name, without its extension, along the PATH; empty when there is none.
NativePath findProgram(const std::string& name);

/// What the names of programs end in.
const char* programExtension();

// ---- Child processes ------------------------------------------------------------------------

struct ChildLimits {
    std::chrono::milliseconds time;
    std::uint64_t memory;              ///< in bytes, of what it really uses
    std::uint64_t refused;             ///< in bytes, of what the system lets it have; 0 for all
    std::size_t output;                ///< in bytes
    std::function<bool()> interrupted; ///< asked now and then; true ends the child
};

struct ChildResult {
    enum class End {
        notStarted,
        exited,
        crashed, ///< ended by the system
        timedOut,
        outOfMemory,
        tooMuchOutput,
        interrupted,
        unknown, ///< the system does not tell, for this program does not want to know
    };
    End end = End::notStarted;
    int status = 0;           ///< of one that exited
    std::wstring words;       ///< what the system calls the crash; why it was not started
    std::string output;       ///< what it wrote to its standard output
    std::uint64_t memory = 0; ///< the most that it was seen to use, in bytes
};

/// Runs a program without standard input and standard error, and waits for its end. Kills it, and
/// what it has started, at a limit.
/// \throws what `limits.interrupted` throws, after the program was killed.
ChildResult runChild(const NativePath& program, const std::vector<NativePath>& arguments,
                     const ChildLimits& limits);

/// The calling thread's own pipe to the process that started this one.
///
/// Made of standard output, which from then on leads nowhere, as does standard error: what others
/// write there does not get between our words. Other files that this process has inherited are
/// closed.
class AnswerPipe {
  public:
    AnswerPipe();
    /// May be called in a handler of a signal.
    void write(const char* data, std::size_t size);

  private:
    std::intptr_t handle;
};

/// Takes standard output away from everybody else: what is written there from now on goes to
/// standard error. Gives where it led before, for `writeReserved`; -1 when it led nowhere.
int reserveOutput();

/// Writes all of it, with line ends as standard output has them; false when that fails.
bool writeReserved(int descriptor, const char* data, std::size_t size);

/// Undoes what the program that started this one may have wanted, so that the system tells how
/// children end.
void wantEndsOfChildren();

/// Sees to it that this process, which is to load libraries that may do anything, goes with the one
/// that started it, opens no dialogs, leaves no dump, and is refused more than `refused` bytes of
/// memory unless that is 0. Reserved addresses count where they may be written to.
void confine(std::uint64_t refused);

/// Ends this process at once; nothing of the libraries in it is run.
[[noreturn]] void endProcess(int status);

/// The fault that the system noticed, and let somebody pass over, in this process last: a crash in
/// a library's initialisers, where the system catches such. Empty when there was none.
std::wstring passedFault();

/// A number that no other process has now.
unsigned long processNumber();

} // namespace Mz::Tools::System

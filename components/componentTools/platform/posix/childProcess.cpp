// SPDX-License-Identifier: BSL-1.0
/// The child runs in its own process group, so that the processes that it starts can be killed with
/// it. The parent polls the used memory in /proc: limits of the system count reserved addresses
/// too, which code generators and drivers reserve in large amounts. The end of the child wakes the
/// parent through a descriptor of the process, because the end of its output is no sign of it: the
/// child may close the pipe earlier, and a process that it started may keep the pipe open. The
/// child's standard input is a socket: unlike a pipe, it can be written without a signal if the
/// child has closed it.
#include "components/componentTools/platform/system.h"

#include "components/componentTools/platform/posix/inheritedNumber.h"

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <string_view>
#include <sys/resource.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

namespace Mz::Tools::System {

namespace {

using Clock = std::chrono::steady_clock;

/// The polling interval of the child's memory.
constexpr std::chrono::nanoseconds pause = std::chrono::milliseconds(10);
/// The first interval in which a child is polled whose end the system cannot report.
constexpr std::chrono::nanoseconds shortestPause = std::chrono::microseconds(50);

class Descriptor {
  public:
    explicit Descriptor(int number) : value(number) {}
    ~Descriptor() { close(); }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;
    int get() const { return value; }
    void close() {
        if (value >= 0)
            ::close(value);
        value = -1;
    }

  private:
    int value;
};

/// The environment of this process with more variables, which replace those of the same name.
class Environment {
  public:
    explicit Environment(const std::vector<std::pair<std::string, NativePath>>& added) {
        for (const auto& [name, value] : added)
            texts.push_back(name + "=" + value.native());
        for (char** variable = environ; *variable; ++variable)
            if (!isReplaced(*variable))
                pointers.push_back(*variable);
        for (std::string& text : texts)
            pointers.push_back(text.data());
        pointers.push_back(nullptr);
    }
    Environment(const Environment&) = delete;
    Environment& operator=(const Environment&) = delete;
    char** get() { return pointers.data(); }

  private:
    bool isReplaced(std::string_view variable) const {
        return std::any_of(texts.begin(), texts.end(), [&](const std::string& text) {
            return variable.starts_with(std::string_view(text).substr(0, text.find('=') + 1));
        });
    }

    std::vector<std::string> texts;
    std::vector<char*> pointers;
};

/// Returns a copy of the descriptor above those that a child uses, or -1. A host that has closed
/// its standard files gets their numbers for new files.
int raised(int descriptor) {
    constexpr int first = inheritedNumber + 1;
    return ::fcntl(descriptor, F_DUPFD_CLOEXEC, first);
}

/// The files of a child; -1 for none.
struct Files {
    int input, output, file;
};

/// Starts the program in its own process group. Returns 0 or an error number.
int start(const NativePath& program, const std::vector<NativePath>& arguments, const Files& files,
          char** environment, pid_t& child) {
    std::vector<char*> pointers{const_cast<char*>(program.c_str())};
    for (const NativePath& argument : arguments)
        pointers.push_back(const_cast<char*>(argument.c_str()));
    pointers.push_back(nullptr);

    posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    if (files.input < 0)
        ::posix_spawn_file_actions_addopen(&actions, STDIN_FILENO, "/dev/null", O_RDONLY, 0);
    else
        ::posix_spawn_file_actions_adddup2(&actions, files.input, STDIN_FILENO);
    ::posix_spawn_file_actions_adddup2(&actions, files.output, STDOUT_FILENO);
    ::posix_spawn_file_actions_addopen(&actions, STDERR_FILENO, "/dev/null", O_WRONLY, 0);
    if (files.file >= 0)
        ::posix_spawn_file_actions_adddup2(&actions, files.file, inheritedNumber);
    posix_spawnattr_t attributes;
    ::posix_spawnattr_init(&attributes);
    sigset_t signals;
    ::sigemptyset(&signals);
    ::posix_spawnattr_setsigmask(&attributes, &signals);
    ::sigfillset(&signals);
    ::posix_spawnattr_setsigdefault(&attributes, &signals);
    ::posix_spawnattr_setpgroup(&attributes, 0);
    ::posix_spawnattr_setflags(&attributes, POSIX_SPAWN_SETPGROUP | POSIX_SPAWN_SETSIGMASK |
                                                POSIX_SPAWN_SETSIGDEF);
    const int failure =
        ::posix_spawn(&child, program.c_str(), &actions, &attributes, pointers.data(), environment);
    ::posix_spawnattr_destroy(&attributes);
    ::posix_spawn_file_actions_destroy(&actions);
    return failure;
}

/// Returns the memory that the process uses, in bytes; 0 if it has ended. Called after each piece
/// of output, so it makes no more than the three system calls that it needs.
std::uint64_t memoryOf(pid_t process) {
    char text[64];
    std::snprintf(text, sizeof text, "/proc/%ld/statm", static_cast<long>(process));
    const Descriptor file(::open(text, O_RDONLY | O_CLOEXEC));
    const ssize_t size = file.get() < 0 ? 0 : ::read(file.get(), text, sizeof text - 1);
    text[std::max<ssize_t>(size, 0)] = '\0';
    const char* const second = std::strchr(text, ' '); // After the reserved addresses.
    const std::uint64_t resident = second ? std::strtoull(second, nullptr, 10) : 0;
    return resident * static_cast<std::uint64_t>(::sysconf(_SC_PAGESIZE));
}

/// Returns a descriptor that becomes readable when the process ends; -1 if the system has none, as
/// before Linux 5.3 and in some containers.
int endOf(pid_t process) {
#ifdef SYS_pidfd_open
    return static_cast<int>(::syscall(SYS_pidfd_open, process, 0));
#else
    static_cast<void>(process);
    return -1;
#endif
}

const wchar_t* signalName(int number) {
    switch (number) {
    case SIGSEGV: return L"access to memory that is not there (SIGSEGV)";
    case SIGBUS: return L"access to memory that has no content (SIGBUS)";
    case SIGILL: return L"an instruction that does not exist (SIGILL)";
    case SIGFPE: return L"an arithmetic fault (SIGFPE)";
    case SIGABRT: return L"abort (SIGABRT)";
    case SIGTRAP: return L"a breakpoint (SIGTRAP)";
    case SIGKILL: return L"killed from outside (SIGKILL)";
    default: return nullptr;
    }
}

/// Watches one child until it ends. The destructor kills and reaps a child that still runs, because
/// the caller's `interrupted` and the growth of the output may throw.
class Watch {
  public:
    /// \param socket  the other end of the child's standard input; -1 for none
    Watch(pid_t process, int pipe, int socket, const ChildLimits& allowed,
          const ChildSupply& supplied)
        : child(process), ended(endOf(process)), output(pipe), input(socket), limits(allowed),
          supply(supplied), end(Clock::now() + allowed.time) {}
    ~Watch() {
        if (reaped)
            return;
        ::kill(-child, SIGKILL);
        while (::waitpid(child, nullptr, 0) < 0 && errno == EINTR)
            continue;
    }
    Watch(const Watch&) = delete;
    Watch& operator=(const Watch&) = delete;

    ChildResult result() {
        int status = 0;
        rusage usage{};
        while (!over(status, usage)) {
            sendInput();
            waitForEvent();
            readOutput();
            judge();
        }
        // Kill the processes that the child started, too. They could write for ever.
        ::kill(-child, SIGKILL);
        readOutput();
        if (judged)
            return std::move(judgement);
        judgement.memory = std::max(judgement.memory, mostMemory(usage));
        if (unknown)
            judgement.end = ChildResult::End::unknown;
        else if (judgement.memory >= limits.memory) // It may have ended between two polls.
            judgement.end = ChildResult::End::outOfMemory;
        else if (WIFSIGNALED(status))
            noteSignal(WTERMSIG(status));
        else
            noteExit(WEXITSTATUS(status));
        return std::move(judgement);
    }

  private:
    /// The system's peak for an ended child includes the memory of this process when it started the
    /// child. Only a higher value is the child's own.
    static std::uint64_t mostMemory(const rusage& usage) {
        rusage own{};
        ::getrusage(RUSAGE_SELF, &own);
        constexpr std::uint64_t unit = 1024;
        return usage.ru_maxrss > own.ru_maxrss ? static_cast<std::uint64_t>(usage.ru_maxrss) * unit
                                               : 0;
    }

    /// Polls the memory that the child uses.
    bool usesTooMuch() {
        judgement.memory = std::max(judgement.memory, memoryOf(child));
        return judgement.memory >= limits.memory;
    }

    bool over(int& status, rusage& usage) {
        // A debugger of the child receives its end first. Wait for that, too.
        const pid_t found = ::wait4(child, &status, judged || hasEnded ? 0 : WNOHANG, &usage);
        // If this process ignores SIGCHLD, the system does not store the child's exit status.
        unknown = found < 0 && errno == ECHILD;
        reaped = found == child || (found < 0 && errno != EINTR);
        return reaped;
    }

    bool hasInput() const { return supply.input && !supply.input->empty(); }

    /// Sends as much as the child's buffer takes.
    void sendInput() {
        while (hasInput()) {
            const ssize_t sent = ::send(input, supply.input->data(), supply.input->size(),
                                        MSG_NOSIGNAL | MSG_DONTWAIT);
            if (sent > 0)
                supply.input->erase(0, static_cast<std::size_t>(sent));
            else if (errno == EAGAIN)
                return;
            else if (errno != EINTR)
                supply.input->clear(); // The child has closed its standard input.
        }
    }

    /// Waits for output, for the end of the child, or until it can take input.
    void waitForEvent() {
        // A closed pipe is always ready, so do not poll it: the system skips negative descriptors.
        pollfd wanted[] = {{closed ? -1 : output, POLLIN, 0},
                           {hasInput() ? input : -1, POLLOUT, 0},
                           {ended.get(), POLLIN, 0}};
        const timespec longest{0, static_cast<long>(nextPause().count())};
        hasEnded = ::ppoll(wanted, 3, &longest, nullptr) > 0 && wanted[2].revents != 0;
    }

    /// Returns the time to wait. Without a descriptor of the process, the end of its output is the
    /// first sign of its end, which follows soon: poll often at first, then less often.
    std::chrono::nanoseconds nextPause() {
        if (ended.get() >= 0 || !closed)
            return pause;
        closedPause = std::min(pause, closedPause * 2);
        return closedPause;
    }

    /// Reads the available output, but not for ever, because the child may write faster.
    void readOutput() {
        char block[65536];
        constexpr int mostBlocks = 64;
        for (int count = 0;
             count < mostBlocks && !closed && judgement.output.size() <= limits.output; ++count) {
            const ssize_t got = ::read(output, block, sizeof block);
            if (got > 0)
                receive(block, static_cast<std::size_t>(got));
            else if (got == 0)
                closed = true;
            else if (errno == EAGAIN)
                return;
            else if (errno != EINTR)
                giveUp(errno);
        }
    }

    /// Ends the child, whose output cannot be read: it is not at fault.
    void giveUp(int error) {
        closed = true;
        judgement.detail = displayName(std::strerror(error));
        if (!judged)
            stop(ChildResult::End::notStarted);
    }

    void receive(const char* bytes, std::size_t size) {
        judgement.output.append(bytes, size);
        if (limits.received)
            limits.received(judgement.output);
        if (limits.outputRestartsTime)
            end = Clock::now() + limits.time;
    }

    void judge() {
        if (judged)
            return;
        if (limits.complete && limits.complete())
            stop(ChildResult::End::complete);
        else if (limits.interrupted && limits.interrupted())
            stop(ChildResult::End::interrupted);
        else if (usesTooMuch())
            stop(ChildResult::End::outOfMemory);
        else if (judgement.output.size() > limits.output)
            stop(ChildResult::End::tooMuchOutput);
        else if (Clock::now() >= end)
            stop(ChildResult::End::timedOut);
    }

    void stop(ChildResult::End reason) {
        judgement.end = reason;
        judged = true;
        ::kill(-child, SIGKILL);
    }

    void noteSignal(int number) {
        judgement.end = ChildResult::End::crashed;
        const wchar_t* name = signalName(number);
        judgement.detail = name ? name : L"signal " + std::to_wstring(number);
    }

    void noteExit(int status) {
        judgement.end = ChildResult::End::exited;
        judgement.status = status;
    }

    pid_t child;
    const Descriptor ended;
    int output;
    int input;
    const ChildLimits& limits;
    const ChildSupply& supply;
    Clock::time_point end;
    ChildResult judgement;
    std::chrono::nanoseconds closedPause = shortestPause / 2; ///< the last one after the output
    bool judged = false;
    bool hasEnded = false;
    bool reaped = false;
    bool closed = false;
    bool unknown = false;
};

} // namespace

InheritableFile::InheritableFile(const NativePath& path) {
    // A pipe without a writer would block.
    const int file = ::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY);
    struct stat status;
    if (file >= 0 && ::fstat(file, &status) == 0 && S_ISREG(status.st_mode))
        handle = file;
    else if (file >= 0)
        ::close(file);
}

InheritableFile::~InheritableFile() {
    if (isOpen())
        ::close(static_cast<int>(handle));
}

bool InheritableFile::isOpen() const {
    return handle >= 0;
}

std::string InheritableFile::argument() const {
    return std::to_string(inheritedNumber);
}

ChildResult runChild(const NativePath& program, const std::vector<NativePath>& arguments,
                     const ChildLimits& limits, const ChildSupply& supply) {
    ChildResult failed;
    int ends[2] = {-1, -1}, sockets[2] = {-1, -1};
    const bool made =
        ::pipe2(ends, O_CLOEXEC) == 0 &&
        (!supply.input || ::socketpair(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0, sockets) == 0);
    const Descriptor output(ends[0]), ownInput(sockets[0]);
    Descriptor childOutput(ends[1]), childInput(sockets[1]);
    if (!made) {
        failed.detail = displayName(std::strerror(errno));
        return failed;
    }
    ::fcntl(output.get(), F_SETFL, O_NONBLOCK);
    pid_t child = 0;
    Environment environment(limits.environment);
    int failure = 0;
    {
        const Descriptor high[] = {
            Descriptor(supply.input ? raised(childInput.get()) : -1),
            Descriptor(raised(childOutput.get())),
            Descriptor(supply.file ? raised(static_cast<int>(supply.file->number())) : -1)};
        // Without its pipe, the child would write to the standard output of this process.
        if ((supply.input && high[0].get() < 0) || high[1].get() < 0 ||
            (supply.file && high[2].get() < 0))
            failure = errno;
        else
            failure = start(program, arguments, {high[0].get(), high[1].get(), high[2].get()},
                            environment.get(), child);
    }
    childOutput.close();
    childInput.close();
    if (failure) {
        failed.detail = displayName(program) + L": " + displayName(std::strerror(failure));
        return failed;
    }
    return Watch(child, output.get(), ownInput.get(), limits, supply).result();
}

} // namespace Mz::Tools::System

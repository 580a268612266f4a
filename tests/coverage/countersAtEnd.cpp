// SPDX-License-Identifier: BSL-1.0
/// Writes the counters of a process that ends without running its exit handlers. Preloaded into
/// every process of a coverage run, so that the libraries need not know of it: `_exit` and `abort`
/// are replaced by functions that first write the counters of all modules. A module's counters are
/// written when it is unloaded, too. A process that the kernel kills writes nothing.
///
/// The process of a guarded import may not open files for writing. So before a process gives up its
/// rights it starts a broker, a second process that keeps them, which opens the files of counters
/// for it and passes the descriptors through a socket. The broker leaves the process group and
/// ends with the socket. The host kills such a process as soon as it has the answer; here it leaves
/// it a moment to write.
#include <csignal>
#include <cstdarg>
#include <cstdlib>
#include <cstring>
#include <dlfcn.h>
#include <fcntl.h>
#include <fstream>
#include <link.h>
#include <string>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <sys/syscall.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

int broker = -1;

/// Calls a function of a module. Looks it up in the module itself: each has its own counters.
void call(void* module, const char* name) {
    if (void* const function = ::dlsym(module, name))
        reinterpret_cast<void (*)()>(function)();
}

int writeCountersOf(dl_phdr_info* info, std::size_t, void*) {
    // The program has an empty name here, and is null for dlopen.
    const char* const file = *info->dlpi_name ? info->dlpi_name : nullptr;
    if (void* const module = ::dlopen(file, RTLD_LAZY | RTLD_NOLOAD)) {
        call(module, "__gcov_dump");
        // What is counted from now on is added by the next call.
        call(module, "__gcov_reset");
        ::dlclose(module);
    }
    return 0;
}

void writeCounters() {
    ::dl_iterate_phdr(writeCountersOf, nullptr);
}

[[noreturn]] void endNow(int status) {
    for (;;)
        ::syscall(SYS_exit_group, status);
}

// ---- the broker -------------------------------------------------------------------------------

/// Room for one descriptor in a message.
union Control {
    cmsghdr header;
    char bytes[CMSG_SPACE(sizeof(int))];
};

msghdr messageOf(iovec& content, Control& control) {
    msghdr message{};
    message.msg_iov = &content;
    message.msg_iovlen = 1;
    message.msg_control = &control;
    message.msg_controllen = sizeof control;
    return message;
}

void sendDescriptor(int socket, int descriptor) {
    char result = descriptor < 0 ? 'n' : 'y';
    iovec content{&result, 1};
    Control control{};
    msghdr message = messageOf(content, control);
    if (descriptor < 0) {
        message.msg_control = nullptr;
        message.msg_controllen = 0;
    } else {
        cmsghdr* const header = CMSG_FIRSTHDR(&message);
        header->cmsg_level = SOL_SOCKET;
        header->cmsg_type = SCM_RIGHTS;
        header->cmsg_len = CMSG_LEN(sizeof descriptor);
        std::memcpy(CMSG_DATA(header), &descriptor, sizeof descriptor);
    }
    ::sendmsg(socket, &message, 0);
}

int receiveDescriptor(int socket) {
    char result = 0;
    iovec content{&result, 1};
    Control control{};
    msghdr message = messageOf(content, control);
    if (::recvmsg(socket, &message, MSG_CMSG_CLOEXEC) != 1)
        return -1;
    const cmsghdr* const header = CMSG_FIRSTHDR(&message);
    int descriptor = -1;
    if (header && header->cmsg_type == SCM_RIGHTS)
        std::memcpy(&descriptor, CMSG_DATA(header), sizeof descriptor);
    return descriptor;
}

[[noreturn]] void serve(int socket) {
    ::setsid();
    // The reader of a pipe of the process must not wait for the broker.
    if (socket > 0)
        ::syscall(SYS_close_range, 0, socket - 1, 0);
    ::syscall(SYS_close_range, socket + 1, ~0U, 0);
    char name[4096];
    for (;;) {
        const ssize_t length = ::recv(socket, name, sizeof name - 1, 0);
        if (length <= 0)
            endNow(0);
        name[length] = 0;
        const int descriptor =
            static_cast<int>(::syscall(SYS_openat, AT_FDCWD, name, O_RDWR | O_CREAT, 0666));
        sendDescriptor(socket, descriptor);
        if (descriptor >= 0)
            ::close(descriptor);
    }
}

void startBroker() {
    int sockets[2];
    if (::socketpair(AF_UNIX, SOCK_SEQPACKET | SOCK_CLOEXEC, 0, sockets) != 0)
        return;
    // The copy that serves is a grandchild, so that this process has no child that it did not
    // start.
    const pid_t child = ::fork();
    if (child == 0) {
        if (::fork() == 0)
            serve(sockets[1]);
        endNow(0);
    }
    ::waitpid(child, nullptr, 0);
    ::close(sockets[1]);
    broker = sockets[0];
}

// ---- the host -------------------------------------------------------------------------------

/// Returns whether the process has given up rights.
bool isConfined(pid_t process) {
    std::ifstream status("/proc/" + std::to_string(process) + "/status");
    for (std::string line; std::getline(status, line);)
        if (line.starts_with("NoNewPrivs:"))
            return line.ends_with('1');
    return false;
}

/// Waits until the child has ended, but not long. Leaves it to be reaped.
void awaitEnd(pid_t child) {
    constexpr int mostPauses = 50;
    constexpr useconds_t pause = 10'000;
    for (int count = 0; count < mostPauses; ++count) {
        siginfo_t end{};
        if (::waitid(P_PID, static_cast<id_t>(child), &end, WEXITED | WNOHANG | WNOWAIT) != 0 ||
            end.si_pid != 0)
            return;
        ::usleep(pause);
    }
}

} // namespace

extern "C" {

[[noreturn]] void _exit(int status) {
    writeCounters();
    endNow(status);
}

[[noreturn]] void _Exit(int status) {
    _exit(status);
}

[[noreturn]] void abort() {
    writeCounters();
    reinterpret_cast<void (*)()>(::dlsym(RTLD_NEXT, "abort"))();
    endNow(127);
}

int kill(pid_t process, int signal) noexcept {
    if (signal == SIGKILL && process < 0 && isConfined(-process))
        awaitEnd(-process);
    return static_cast<int>(::syscall(SYS_kill, process, signal));
}

int prctl(int option, ...) {
    if (option == PR_SET_NO_NEW_PRIVS && broker < 0)
        startBroker();
    va_list arguments;
    va_start(arguments, option);
    unsigned long values[4];
    for (unsigned long& value : values)
        value = va_arg(arguments, unsigned long);
    va_end(arguments);
    return static_cast<int>(
        ::syscall(SYS_prctl, option, values[0], values[1], values[2], values[3]));
}

int open(const char* name, int flags, ...) {
    mode_t mode = 0;
    if (flags & (O_CREAT | O_TMPFILE)) {
        va_list arguments;
        va_start(arguments, flags);
        mode = va_arg(arguments, mode_t);
        va_end(arguments);
    }
    const int descriptor = static_cast<int>(::syscall(SYS_openat, AT_FDCWD, name, flags, mode));
    if (descriptor >= 0 || broker < 0 || !std::string(name).ends_with(".gcda"))
        return descriptor;
    if (::send(broker, name, std::strlen(name), 0) <= 0)
        return -1;
    return receiveDescriptor(broker);
}
}

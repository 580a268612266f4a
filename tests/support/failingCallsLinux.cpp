// SPDX-License-Identifier: BSL-1.0
// Defines the functions in the program. Each counts its calls and passes them on.
#include "tests/support/failingCalls.h"

#include <algorithm>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <poll.h>
#include <spawn.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/uio.h>
#include <sys/wait.h>
#include <unistd.h>

namespace {

constexpr int unlimited = -1;
constinit thread_local int allowedCalls = unlimited;
constinit thread_local int errorNumber = 0;
constinit thread_local const char* failedName = "";
constinit thread_local bool transfersAreShort = false;

/// Returns whether this call fails, and sets `errno` then.
bool fails(const char* name) {
    if (allowedCalls == unlimited)
        return false;
    if (allowedCalls-- > 0)
        return false;
    allowedCalls = unlimited;
    failedName = name;
    errno = errorNumber;
    return true;
}

/// Returns the function of the C library.
template <class Function>
Function* next(const char* name) {
    return reinterpret_cast<Function*>(::dlsym(RTLD_NEXT, name));
}

std::size_t transferred(std::size_t size) {
    return transfersAreShort ? std::min<std::size_t>(size, 1) : size;
}

} // namespace

#pragma GCC visibility push(default)
extern "C" {

int open(const char* path, int flags, ...) {
    static auto* const real = next<int(const char*, int, ...)>("open");
    va_list rest;
    va_start(rest, flags);
    const unsigned int mode = flags & O_CREAT ? va_arg(rest, unsigned int) : 0;
    va_end(rest);
    return fails("open") ? -1 : real(path, flags, mode);
}

FILE* fopen64(const char* path, const char* mode) {
    static auto* const real = next<FILE*(const char*, const char*)>("fopen64");
    return fails("fopen") ? nullptr : real(path, mode);
}

ssize_t read(int file, void* data, std::size_t size) {
    static auto* const real = next<ssize_t(int, void*, std::size_t)>("read");
    return fails("read") ? -1 : real(file, data, transferred(size));
}

ssize_t pread(int file, void* data, std::size_t size, off_t at) {
    static auto* const real = next<ssize_t(int, void*, std::size_t, off_t)>("pread");
    return fails("pread") ? -1 : real(file, data, transferred(size), at);
}

ssize_t write(int file, const void* data, std::size_t size) {
    static auto* const real = next<ssize_t(int, const void*, std::size_t)>("write");
    return fails("write") ? -1 : real(file, data, transferred(size));
}

ssize_t writev(int file, const iovec* parts, int count) {
    static auto* const real = next<ssize_t(int, const iovec*, int)>("writev");
    if (fails("writev"))
        return -1;
    if (transfersAreShort && count > 0 && parts[0].iov_len > 0)
        return ::write(file, parts[0].iov_base, 1);
    return real(file, parts, count);
}

off64_t lseek64(int file, off64_t offset, int origin) noexcept {
    static auto* const real = next<off64_t(int, off64_t, int)>("lseek64");
    return fails("lseek") ? -1 : real(file, offset, origin);
}

int fstat(int file, struct stat* status) noexcept {
    static auto* const real = next<int(int, struct stat*)>("fstat");
    return fails("fstat") ? -1 : real(file, status);
}

int stat(const char* path, struct stat* status) noexcept {
    static auto* const real = next<int(const char*, struct stat*)>("stat");
    return fails("stat") ? -1 : real(path, status);
}

int lstat(const char* path, struct stat* status) noexcept {
    static auto* const real = next<int(const char*, struct stat*)>("lstat");
    return fails("lstat") ? -1 : real(path, status);
}

int fstatat(int folder, const char* path, struct stat* status, int flags) noexcept {
    static auto* const real = next<int(int, const char*, struct stat*, int)>("fstatat");
    return fails("fstatat") ? -1 : real(folder, path, status, flags);
}

ssize_t readlink(const char* path, char* text, std::size_t size) noexcept {
    static auto* const real = next<ssize_t(const char*, char*, std::size_t)>("readlink");
    return fails("readlink") ? -1 : real(path, text, size);
}

DIR* opendir(const char* path) {
    static auto* const real = next<DIR*(const char*)>("opendir");
    return fails("opendir") ? nullptr : real(path);
}

dirent* readdir(DIR* folder) {
    static auto* const real = next<dirent*(DIR*)>("readdir");
    return fails("readdir") ? nullptr : real(folder);
}

int fsync(int file) {
    static auto* const real = next<int(int)>("fsync");
    return fails("fsync") ? -1 : real(file);
}

int fchmod(int file, mode_t mode) noexcept {
    static auto* const real = next<int(int, mode_t)>("fchmod");
    return fails("fchmod") ? -1 : real(file, mode);
}

int rename(const char* from, const char* to) noexcept {
    static auto* const real = next<int(const char*, const char*)>("rename");
    return fails("rename") ? -1 : real(from, to);
}

int pipe2(int* ends, int flags) noexcept {
    static auto* const real = next<int(int*, int)>("pipe2");
    return fails("pipe2") ? -1 : real(ends, flags);
}

int fcntl(int file, int command, ...) {
    static auto* const real = next<int(int, int, ...)>("fcntl");
    va_list rest;
    va_start(rest, command);
    void* const argument = va_arg(rest, void*);
    va_end(rest);
    return fails("fcntl") ? -1 : real(file, command, argument);
}

int ppoll(pollfd* files, nfds_t count, const timespec* time, const sigset_t* signals) {
    static auto* const real = next<int(pollfd*, nfds_t, const timespec*, const sigset_t*)>("ppoll");
    return fails("ppoll") ? -1 : real(files, count, time, signals);
}

pid_t wait4(pid_t child, int* status, int options, rusage* usage) noexcept {
    static auto* const real = next<pid_t(pid_t, int*, int, rusage*)>("wait4");
    // The process would stay a zombie: with other errors there is no child.
    return errorNumber == EINTR && fails("wait4") ? -1 : real(child, status, options, usage);
}

} // extern "C"
#pragma GCC visibility pop

namespace Mz::Test {

FailingCall::FailingCall(int allowed, int error) {
    failedName = "";
    errorNumber = error;
    allowedCalls = allowed;
}

FailingCall::~FailingCall() {
    allowedCalls = unlimited;
}

std::string FailingCall::failed() const {
    return failedName;
}

ShortTransfers::ShortTransfers() {
    transfersAreShort = true;
}

ShortTransfers::~ShortTransfers() {
    transfersAreShort = false;
}

int openDescriptors() {
    int count = 0;
    for (int descriptor = 0; descriptor < 256; ++descriptor)
        count += ::fcntl(descriptor, F_GETFD, nullptr) >= 0;
    return count;
}

} // namespace Mz::Test

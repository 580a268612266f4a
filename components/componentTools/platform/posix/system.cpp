// SPDX-License-Identifier: BSL-1.0
/// Repeats the search of the Linux loader for dependencies (DT_RPATH, LD_LIBRARY_PATH, DT_RUNPATH,
/// the cache, the default folders), because the loader itself cannot search without loading.
#include "components/componentTools/platform/system.h"

#include "components/componentManager/componentImp.h"
#include "components/componentManager/nativeText.h"
#include "components/componentTools/platform/posix/inheritedNumber.h"
#include "components/componentTools/platform/posix/loaderCache.h"
#include "components/platform/elfMachine.h"
#include "components/platform/platform.h"

#include <algorithm>
#include <cerrno>
#include <charconv>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <dlfcn.h>
#include <ext/stdio_filebuf.h>
#include <fcntl.h>
#include <initializer_list>
#include <optional>
#include <sys/prctl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/syscall.h>
#include <system_error>
#include <type_traits>
#include <unistd.h>
#include <utility>

namespace Mz::Tools::System {

namespace {

constexpr int mostSignals = 64;

bool isFile(const NativePath& path) {
    struct stat status;
    return ::stat(path.c_str(), &status) == 0 && S_ISREG(status.st_mode);
}

bool isLoaded(const std::string& name) {
    void* const module = ::dlopen(name.c_str(), RTLD_LAZY | RTLD_LOCAL | RTLD_NOLOAD);
    if (module)
        ::dlclose(module);
    else
        ::dlerror();
    return module != nullptr;
}

/// Returns `folder` with the loader's variables replaced.
std::string expanded(std::string folder, const NativePath& library) {
    const std::pair<const char*, std::string> variables[] = {
        {"$ORIGIN", library.parent_path().string()},
        {"${ORIGIN}", library.parent_path().string()},
        {"$LIB", std::string("lib/") + platform::multiarchFolder},
        {"${LIB}", std::string("lib/") + platform::multiarchFolder},
        {"$PLATFORM", platform::loaderPlatform},
        {"${PLATFORM}", platform::loaderPlatform}};
    for (const auto& [variable, value] : variables)
        for (std::size_t at = 0; (at = folder.find(variable, at)) != std::string::npos;
             at += value.size())
            folder.replace(at, std::strlen(variable), value);
    return folder;
}

std::vector<std::string> foldersOfEnvironment() {
    std::vector<std::string> folders;
    const char* list = std::getenv("LD_LIBRARY_PATH");
    for (std::string rest = list ? list : ""; !rest.empty();) {
        const std::size_t end = rest.find_first_of(":;");
        folders.push_back(end == 0 ? "." : rest.substr(0, end));
        rest.erase(0, end == std::string::npos ? end : end + 1);
    }
    return folders;
}

} // namespace

std::wstring displayName(const NativePath& path) {
    return Mz::displayName(path);
}

std::string encode(const std::wstring& text, int) {
    return toNarrow(text, '?');
}

std::vector<std::string> arguments(int count, char** values) {
    return {values + (count > 0 ? 1 : 0), values + count};
}

NativePath pathOfArgument(const std::string& argument) {
    return argument;
}

ImageFormat ownFormat() {
    return ImageFormat::elf;
}

FileAttributes fileAttributes(const NativePath& path) {
    struct stat status;
    FileAttributes attributes;
    attributes.hidden = path.filename().native().starts_with('.');
    attributes.directory = ::stat(path.c_str(), &status) == 0 && S_ISDIR(status.st_mode);
    return attributes;
}

namespace {

/// Returns the folder in `parent` whose name is `name` except for case.
std::optional<NativePath> findSubfolder(const NativePath& parent, const std::wstring& name) {
    std::error_code failure;
    const std::optional<NativePath> exact = toNativePath(name);
    if (exact && std::filesystem::is_directory(parent / *exact, failure))
        return parent / *exact;
    const std::filesystem::directory_iterator end;
    for (std::filesystem::directory_iterator entry(parent, failure); !failure && entry != end;
         entry.increment(failure)) {
        const std::optional<std::wstring> other = toWideName(entry->path().filename());
        std::error_code unknown;
        if (other && platform::lowerCase(*other) == name && entry->is_directory(unknown))
            return entry->path();
    }
    return std::nullopt;
}

} // namespace

std::optional<NativePath> findFolder(const std::wstring& normalised) {
    std::optional<NativePath> folder(normalised.starts_with(L'\\') ? "/" : ".");
    for (std::size_t begin = 0; folder && begin <= normalised.size();) {
        const std::size_t end = std::min(normalised.find(L'\\', begin), normalised.size());
        const std::wstring name = normalised.substr(begin, end - begin);
        if (!name.empty() && name != L".")
            folder = findSubfolder(*folder, name);
        begin = end + 1;
    }
    return folder;
}

const wchar_t* loaderPathVariable() {
    return L"LD_LIBRARY_PATH";
}

namespace {

/// Returns the folders that the loader searches before its cache. DT_RPATH applies to indirect
/// dependencies too, except those of libraries that have a DT_RUNPATH. DT_RUNPATH applies to direct
/// dependencies only, and replaces the library's DT_RPATH.
std::vector<std::string> foldersFor(const Needer& needer) {
    std::vector<std::string> folders;
    if (needer.image.runpath.empty())
        for (const Needer* owner = &needer; owner; owner = owner->loader)
            if (owner->image.runpath.empty())
                for (const std::string& folder : owner->image.rpath)
                    folders.push_back(expanded(folder, owner->library));
    for (const std::string& folder : foldersOfEnvironment())
        folders.push_back(expanded(folder, needer.library));
    for (const std::string& folder : needer.image.runpath)
        folders.push_back(expanded(folder, needer.library));
    return folders;
}

} // namespace

Located findDependency(const std::string& wanted, const Needer& needer, const NativePath&) {
    const std::string name = expanded(wanted, needer.library);
    if (name.find('/') != std::string::npos)
        return {isFile(name), name};
    for (const std::string& folder : foldersFor(needer)) {
        const NativePath file = NativePath(folder) / name;
        if (isFile(file))
            return {true, file};
    }
    if (const std::optional<std::string> file = findInLoaderCache(name); file && isFile(*file))
        return {true, *file};
    const std::string multiarch = platform::multiarchFolder;
    for (const std::string& folder :
         {"/lib/" + multiarch, "/usr/lib/" + multiarch, std::string("/lib64"),
          std::string("/usr/lib64"), std::string("/lib"), std::string("/usr/lib")})
        if (isFile(NativePath(folder) / name))
            return {true, NativePath(folder) / name};
    // The loader also uses a library of that name that this process has already loaded.
    return {isLoaded(name), {}};
}

std::wstring loaderError(const NativePath& path) {
    ::dlerror();
    if (::dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL))
        return L"it loads at the second attempt";
    const char* words = ::dlerror();
    return displayName(words ? words : "");
}

namespace {

/// Returns the file of the library or program that contains a function.
NativePath fileOf(const void* function) {
    Dl_info info;
    if (::dladdr(function, &info) == 0 || !info.dli_fname)
        return {};
    std::error_code failure;
    const NativePath file = std::filesystem::canonical(info.dli_fname, failure);
    return failure ? NativePath() : file;
}

} // namespace

NativePath moduleFolder() {
    return fileOf(reinterpret_cast<const void*>(&moduleFolder)).parent_path();
}

NativePath managerFile() {
    return fileOf(reinterpret_cast<const void*>(&QrGetComponentManager));
}

NativePath findProgram(const std::string& name) {
    const char* list = std::getenv("PATH");
    for (std::string rest = list ? list : ""; !rest.empty();) {
        const std::size_t end = rest.find(':');
        const NativePath program = NativePath(rest.substr(0, end)) / name;
        if (program.is_absolute() && isFile(program) && ::access(program.c_str(), X_OK) == 0)
            return program;
        rest.erase(0, end == std::string::npos ? end : end + 1);
    }
    return {};
}

const char* programExtension() {
    return "";
}

namespace {

bool writeAll(int descriptor, const char* data, std::size_t size) {
    while (size > 0) {
        const ssize_t written = ::write(descriptor, data, size);
        if (written > 0) {
            data += written;
            size -= static_cast<std::size_t>(written);
        } else if (written == 0 || errno != EINTR) {
            return false;
        }
    }
    return true;
}

} // namespace

AnswerPipe::AnswerPipe(bool keepsFile) {
    // The library must not reach files that this process inherited from the host.
    ::syscall(SYS_close_range, keepsFile ? inheritedNumber + 1 : STDERR_FILENO + 1, ~0u, 0);
    // A high number, so that a loop that closes low descriptors does not close the pipe.
    handle = ::fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, 500);
    const int nowhere = ::open("/dev/null", O_RDWR);
    if (nowhere >= 0) {
        ::dup2(nowhere, STDOUT_FILENO);
        ::dup2(nowhere, STDERR_FILENO);
        ::close(nowhere);
    }
}

void AnswerPipe::write(const char* data, std::size_t size) {
    writeAll(static_cast<int>(handle), data, size);
}

InputPipe::InputPipe() {
    handle = ::fcntl(STDIN_FILENO, F_DUPFD_CLOEXEC, 500);
    const int nowhere = ::open("/dev/null", O_RDONLY);
    if (nowhere >= 0 && nowhere != STDIN_FILENO) {
        ::dup2(nowhere, STDIN_FILENO);
        ::close(nowhere);
    }
}

std::size_t InputPipe::read(char* data, std::size_t size) {
    for (;;) {
        const ssize_t got = ::read(static_cast<int>(handle), data, size);
        if (got >= 0)
            return static_cast<std::size_t>(got);
        if (errno != EINTR)
            return 0;
    }
}

bool takeInheritedFile(const std::string& argument, std::ifstream& stream) {
    int number = -1;
    if (std::from_chars(argument.data(), argument.data() + argument.size(), number).ec !=
            std::errc() ||
        number != inheritedNumber)
        return false;
    __gnu_cxx::stdio_filebuf<char> buffer(number, std::ios::in | std::ios::binary);
    if (!buffer.is_open())
        return false;
    *stream.rdbuf() = std::move(static_cast<std::filebuf&>(buffer));
    return true;
}

int reserveOutput() {
    const int reserved = ::fcntl(STDOUT_FILENO, F_DUPFD_CLOEXEC, 3);
    if (::dup2(STDERR_FILENO, STDOUT_FILENO) < 0) {
        const int nowhere = ::open("/dev/null", O_WRONLY);
        if (nowhere >= 0 && nowhere != STDOUT_FILENO) {
            ::dup2(nowhere, STDOUT_FILENO);
            ::close(nowhere);
        }
    }
    return reserved;
}

bool writeReserved(int descriptor, const char* data, std::size_t size) {
    return writeAll(descriptor, data, size);
}

void resetChildSignal() {
    std::signal(SIGCHLD, SIG_DFL);
}

BlockedSignals::BlockedSignals() {
    sigset_t blocked, before;
    ::sigfillset(&blocked);
    for (const int fault : {SIGSEGV, SIGBUS, SIGFPE, SIGILL, SIGTRAP, SIGABRT})
        ::sigdelset(&blocked, fault);
    ::pthread_sigmask(SIG_BLOCK, &blocked, &before);
    for (int number = 1; number <= mostSignals; ++number)
        if (::sigismember(&before, number) == 1)
            previous |= std::uint64_t{1} << (number - 1);
}

BlockedSignals::~BlockedSignals() {
    sigset_t before;
    ::sigemptyset(&before);
    for (int number = 1; number <= mostSignals; ++number)
        if (previous >> (number - 1) & 1)
            ::sigaddset(&before, number);
    ::pthread_sigmask(SIG_SETMASK, &before, nullptr);
}

void confine(std::uint64_t refused) {
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    ::prctl(PR_SET_DUMPABLE, 0);
    const rlimit noDump{0, 0};
    ::setrlimit(RLIMIT_CORE, &noDump);
    // The parent polls the used memory. This limit is for memory that is taken faster than that.
    // RLIMIT_AS would break code generators and drivers, which reserve far more than they use.
    if (refused && dataMayBeLimited) {
        const rlimit data{static_cast<rlim_t>(refused), static_cast<rlim_t>(refused)};
        ::setrlimit(RLIMIT_DATA, &data);
    }
}

void endProcess(int status) {
    ::_exit(status);
}

std::wstring caughtFault() {
    return {};
}

unsigned long processNumber() {
    return static_cast<unsigned long>(::getpid());
}

} // namespace Mz::Tools::System

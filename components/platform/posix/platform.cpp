// SPDX-License-Identifier: BSL-1.0
/// The platform functions for Linux.
///
/// Libraries are checked by the reader of ELF files before they are loaded. The loader has no
/// function that reports whether a load mapped a library or only took a reference, so its count of
/// mapped libraries is compared. It also finds symbols in dependencies, so the address of a symbol
/// is compared with the code segments of the library itself.
#include "components/platform/platform.h"

#include "components/platform/characters.h"
#include "components/platform/posix/elfProbe.h"
#include "components/platform/posix/temporaryErrors.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <dlfcn.h>
#include <fcntl.h>
#include <iterator>
#include <langinfo.h>
#include <libintl.h>
#include <link.h>
#include <locale.h>
#include <pthread.h>
#include <span>
#include <string_view>
#include <sys/stat.h>
#include <system_error>
#include <type_traits>
#include <unistd.h>

namespace Mz::platform {

namespace {

/// A file descriptor, closed at the end.
class Descriptor {
  public:
    explicit Descriptor(int value) : value(value) {}
    ~Descriptor() {
        if (value >= 0)
            ::close(value);
    }
    Descriptor(const Descriptor&) = delete;
    Descriptor& operator=(const Descriptor&) = delete;

    int get() const { return value; }
    explicit operator bool() const { return value >= 0; }

  private:
    int value;
};

/// Returns whether the loader's last failure may be temporary. Discards its message.
///
/// The loader returns no error number. Its message ends with the system's text for one, except
/// where it cannot map a file. A file system without executable files causes that, too: libraries
/// there are tried at each start.
bool takeTemporaryFailure() {
    const char* const text = ::dlerror();
    if (!text)
        return false;
    const std::string_view message(text);
    return message.ends_with(::dgettext("libc", "failed to map segment from shared object")) ||
           std::any_of(std::begin(temporaryErrors), std::end(temporaryErrors),
                       [&](int error) { return message.ends_with(std::strerror(error)); });
}

/// The program headers of a loaded library.
using Segments = std::span<const ElfW(Phdr)>;

/// The argument and result of a search for the segments of one library.
struct SegmentSearch {
    ElfW(Addr) base;
    ElfW(Addr) dynamic; ///< the dynamic section, unique among libraries with the same base
    Segments found;
};

/// The callback of the search, called for each loaded library. A result other than zero ends it.
int checkForSegments(dl_phdr_info* library, std::size_t, void* data) {
    auto& search = *static_cast<SegmentSearch*>(data);
    if (library->dlpi_addr != search.base)
        return 0;
    const Segments segments(library->dlpi_phdr, library->dlpi_phnum);
    for (const ElfW(Phdr) & segment : segments)
        if (segment.p_type == PT_DYNAMIC && search.base + segment.p_vaddr == search.dynamic)
            search.found = segments;
    return search.found.empty() ? 0 : 1;
}

/// Returns the segments of `library` by a search through all loaded libraries.
Segments searchSegments(const link_map& library) {
    SegmentSearch search{library.l_addr, reinterpret_cast<ElfW(Addr)>(library.l_ld), {}};
    ::dl_iterate_phdr(checkForSegments, &search);
    return search.found;
}

/// Returns the segments of `library`.
Segments segmentsOf(Module module, const link_map& library) {
    // RTLD_DI_PHDR, which newer C libraries support. A search through all libraries for each one
    // would make the time of a start quadratic in their number.
    constexpr int programHeaders = 11;
    const ElfW(Phdr)* first = nullptr;
    const int count = ::dlinfo(module, programHeaders, &first);
    if (count > 0 && first)
        return {first, static_cast<std::size_t>(count)};
    ::dlerror(); // Discards the message.
    return searchSegments(library);
}

/// Returns whether the address is in the code of the library itself, not in a dependency and not in
/// its data.
bool isCodeOf(Module module, void* address) {
    link_map* library = nullptr;
    if (::dlinfo(module, RTLD_DI_LINKMAP, &library) != 0)
        return false;
    const ElfW(Addr) inside = reinterpret_cast<ElfW(Addr)>(address) - library->l_addr;
    for (const ElfW(Phdr) & segment : segmentsOf(module, *library))
        if (segment.p_type == PT_LOAD && (segment.p_flags & PF_X) &&
            inside - segment.p_vaddr < segment.p_memsz)
            return true;
    return false;
}

/// Calls a function of the loader that runs initialisers or finalisers of libraries.
///
/// An exception of theirs terminates the process here, because one that passes the loader leaves
/// the loader's lock locked. Ending the thread unwinds the stack, too, and terminates the process
/// as well. The pointer is volatile because the C library declares these functions as not throwing:
/// a compiler that knows the called function would omit the handler.
template <class Result, class... Args>
Result callLoader(Result (*function)(Args...), std::type_identity_t<Args>... args) noexcept {
    Result (*const volatile opaque)(Args...) = function;
    return opaque(args...);
}

/// Loads the library, or takes a reference to it if the process has mapped it.
UsedLibrary load(const NativePath& path) {
    const Module module = callLoader(::dlopen, path.c_str(), RTLD_NOW | RTLD_LOCAL);
    return {module, module != nullptr, !module && takeTemporaryFailure()};
}

/// Returns the number of libraries that the process has ever mapped.
unsigned long long mappingCount() {
    unsigned long long count = 0;
    const auto takeCount = [](dl_phdr_info* library, std::size_t, void* data) {
        *static_cast<unsigned long long*>(data) = library->dlpi_adds;
        return 1;
    };
    ::dl_iterate_phdr(takeCount, &count);
    return count;
}

/// Returns whether a library was mapped under exactly this path, whatever file has that path now.
bool isMappedAs(const NativePath& path) {
    const auto compareName = [](dl_phdr_info* library, std::size_t, void* data) {
        return *static_cast<const NativePath*>(data) == library->dlpi_name ? 1 : 0;
    };
    return ::dl_iterate_phdr(compareName, const_cast<NativePath*>(&path)) != 0;
}

} // namespace

std::optional<NativePath> toNative(std::wstring_view name) {
    return toBytes(name);
}

NativePath openingPath(std::wstring_view, std::wstring_view, const NativePath& found) {
    return found;
}

std::wstring lowerCase(std::wstring text) {
    for (wchar_t& character : text)
        if (character >= L'A' && character <= L'Z')
            character += L'a' - L'A';
    return text;
}

bool namesIgnoreCase() {
    return false;
}

std::optional<std::wstring> firstArgument() {
    std::ifstream commandLine("/proc/self/cmdline", std::ios::binary);
    std::string argument;
    if (!std::getline(commandLine, argument, '\0'))
        return std::nullopt;
    return toCharacters(argument);
}

std::optional<FileStatus> queryFile(const NativePath& path, bool* unknown) {
    struct stat status;
    const bool failed = ::stat(path.c_str(), &status) != 0;
    if (unknown)
        *unknown = failed && isTemporary(errno);
    if (failed)
        return std::nullopt;
    return FileStatus{static_cast<std::uint32_t>(status.st_mtime), status.st_size,
                      S_ISREG(status.st_mode)};
}

bool isSameFile(const NativePath& a, const NativePath& b) {
    struct stat first;
    struct stat second;
    return ::stat(a.c_str(), &first) == 0 && ::stat(b.c_str(), &second) == 0 &&
           first.st_dev == second.st_dev && first.st_ino == second.st_ino;
}

bool openForReading(std::ifstream& stream, const NativePath& path) {
    stream.open(path, std::ios::in | std::ios::binary);
    // A directory can be opened like a file here, but not read.
    std::error_code ignored;
    if (stream.good() && std::filesystem::is_directory(path, ignored)) {
        stream.close();
        stream.setstate(std::ios::failbit);
    }
    return stream.good();
}

Module findLoadedLibrary(const NativePath& path) {
    const Module module = ::dlopen(path.c_str(), RTLD_LAZY | RTLD_LOCAL | RTLD_NOLOAD);
    if (module)
        ::dlclose(module);
    return module;
}

ExportState queryExport(const NativePath& path, const char* symbol) {
    const Descriptor file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK));
    if (!file)
        return isTemporary(errno) ? ExportState::unknown : ExportState::absent;
    return elfExportsFunction(file.get(), symbol);
}

Module loadLibrary(const NativePath& path) {
    return load(path).module;
}

UsedLibrary useLibrary(const NativePath& path, const char* symbol) {
    // The file is checked first: asking the loader for a mapped library opens the file once more.
    const ExportState state = queryExport(path, symbol);
    if (state != ExportState::exported)
        return {isMappedAs(path) ? findLoadedLibrary(path) : nullptr, false,
                state == ExportState::unknown};
    const unsigned long long before = mappingCount();
    const UsedLibrary used = load(path);
    if (!used.module || mappingCount() != before)
        return used;
    unloadLibrary(used.module); // The code that loaded it decides how long it stays.
    return {used.module, false, false};
}

void unloadLibrary(Module module) {
    if (module)
        callLoader(::dlclose, module);
}

void pinThisLibrary() {
    static const Module pinned = [] {
        Dl_info ignored;
        void* entry = nullptr;
        const auto* here = reinterpret_cast<const void*>(&pinThisLibrary);
        if (::dladdr1(here, &ignored, &entry, RTLD_DL_LINKMAP) == 0)
            return Module();
        // This reference is never released. The loader finds the library by this name, even if the
        // file has been replaced. The name of a program is empty.
        const char* const name = static_cast<const link_map*>(entry)->l_name;
        return *name ? ::dlopen(name, RTLD_LAZY | RTLD_NOLOAD) : nullptr;
    }();
    static_cast<void>(pinned);
}

void* findSymbol(Module module, const char* symbol) {
    if (!module)
        return nullptr;
    void* address = ::dlsym(module, symbol);
    if (!address)
        return nullptr;
    // The search includes dependencies, whose symbols do not count.
    return isCodeOf(module, address) ? address : nullptr;
}

QuietErrors::QuietErrors() : previousMode(0) {}
QuietErrors::~QuietErrors() = default;

std::uint32_t currentThreadId() {
    return static_cast<std::uint32_t>(::gettid());
}

void aroundForks(void (*before)(), void (*inParent)(), void (*inChild)()) {
    ::pthread_atfork(before, inParent, inChild);
}

bool usesPlainBytes() {
    const char* name = ::nl_langinfo(_NL_LOCALE_NAME(LC_CTYPE));
    return std::strcmp(name, "C") == 0 || std::strcmp(name, "POSIX") == 0;
}

LocaleSwitch::LocaleSwitch() : plain(::newlocale(LC_ALL_MASK, "C", nullptr)) {}

CLocale::CLocale(LocaleSwitch& shared)
    : shared(shared), previous(::uselocale(static_cast<locale_t>(shared.plain))) {}

CLocale::~CLocale() {
    ::uselocale(static_cast<locale_t>(previous));
}

} // namespace Mz::platform

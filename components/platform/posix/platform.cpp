#include "components/platform/platform.h"

#include "components/platform/characters.h"
#include "components/platform/posix/elfProbe.h"

#include <cerrno>
#include <cstring>
#include <dlfcn.h>
#include <fcntl.h>
#include <langinfo.h>
#include <link.h>
#include <locale.h>
#include <pthread.h>
#include <span>
#include <sys/stat.h>
#include <type_traits>
#include <unistd.h>

namespace Mz::platform {

namespace {

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

/// Whether an operation failed for want of resources, and not because of the file.
bool isShortage(int error) {
    return error == EMFILE || error == ENFILE || error == ENOMEM;
}

/// The segments of a loaded library, as its file describes them.
using Segments = std::span<const ElfW(Phdr)>;

/// What `walkToSegments` looks for among the loaded libraries.
struct SegmentSearch {
    ElfW(Addr) base;
    ElfW(Addr) dynamic; ///< its dynamic section, which tells it from others with the same base
    Segments found;
};

/// Looks at one loaded library; not zero ends the walk.
int lookForSegments(dl_phdr_info* library, std::size_t, void* data) {
    auto& search = *static_cast<SegmentSearch*>(data);
    if (library->dlpi_addr != search.base)
        return 0;
    const Segments segments(library->dlpi_phdr, library->dlpi_phnum);
    for (const ElfW(Phdr) & segment : segments)
        if (segment.p_type == PT_DYNAMIC && search.base + segment.p_vaddr == search.dynamic)
            search.found = segments;
    return search.found.empty() ? 0 : 1;
}

/// The segments of `library`, found among those of all loaded libraries.
Segments walkToSegments(const link_map& library) {
    SegmentSearch search{library.l_addr, reinterpret_cast<ElfW(Addr)>(library.l_ld), {}};
    ::dl_iterate_phdr(lookForSegments, &search);
    return search.found;
}

Segments segmentsOf(Module module, const link_map& library) {
    // RTLD_DI_PHDR, which younger C libraries know: with a walk over all libraries for each of them
    // the time of a start would grow with the square of their number.
    constexpr int programHeaders = 11;
    const ElfW(Phdr)* first = nullptr;
    const int count = ::dlinfo(module, programHeaders, &first);
    if (count > 0 && first)
        return {first, static_cast<std::size_t>(count)};
    ::dlerror(); // The message belongs to nobody.
    return walkToSegments(library);
}

/// Whether the address lies in the code of that very library: neither in one that it depends on,
/// nor in its data.
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
/// What they throw ends the process here: once it has passed the loader, the loader's lock is never
/// released. So does the end of the thread, which unwinds the stack, too. The pointer is volatile
/// because the C library declares these functions as not throwing: a compiler that knew which one
/// it calls would drop the guard.
template <class Result, class... Args>
Result callLoader(Result (*function)(Args...), std::type_identity_t<Args>... args) noexcept {
    Result (*const volatile unknown)(Args...) = function;
    return unknown(args...);
}

/// How many libraries the process has ever mapped.
unsigned long long mappingCount() {
    unsigned long long count = 0;
    const auto takeCount = [](dl_phdr_info* library, std::size_t, void* data) {
        *static_cast<unsigned long long*>(data) = library->dlpi_adds;
        return 1;
    };
    ::dl_iterate_phdr(takeCount, &count);
    return count;
}

/// Whether a library was mapped by this very path, whatever stands there now.
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

NativePath openingPath(const std::wstring&, const std::wstring&, const NativePath& found) {
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

std::optional<FileStatus> queryFile(const NativePath& path) {
    struct stat status;
    if (::stat(path.c_str(), &status) != 0)
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
    // A directory opens like a file here and only refuses to be read.
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
        return isShortage(errno) ? ExportState::unknown : ExportState::absent;
    return elfExportsFunction(file.get(), symbol) ? ExportState::exported : ExportState::absent;
}

Module loadLibrary(const NativePath& path) {
    const Module module = callLoader(::dlopen, path.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (!module)
        ::dlerror(); // The message belongs to nobody.
    return module;
}

UsedLibrary useLibrary(const NativePath& path, const char* symbol) {
    // Asking first whether the library is mapped would open every file a second time.
    const ExportState state = queryExport(path, symbol);
    if (state != ExportState::exported)
        return {isMappedAs(path) ? findLoadedLibrary(path) : nullptr, false,
                state == ExportState::unknown};
    const unsigned long long before = mappingCount();
    const Module module = loadLibrary(path);
    if (!module || mappingCount() != before)
        return {module, module != nullptr, false};
    unloadLibrary(module); // It stays as long as whoever loaded it wants.
    return {module, false, false};
}

void unloadLibrary(Module module) {
    if (module)
        callLoader(::dlclose, module);
}

void keepOwnLibrary() {
    static const Module own = [] {
        Dl_info ignored;
        void* entry = nullptr;
        const auto* here = reinterpret_cast<const void*>(&keepOwnLibrary);
        if (::dladdr1(here, &ignored, &entry, RTLD_DL_LINKMAP) == 0)
            return Module();
        // Never given back. The loader knows the library by this name, whatever is in the file now;
        // a program has none.
        const char* const name = static_cast<const link_map*>(entry)->l_name;
        return *name ? ::dlopen(name, RTLD_LAZY | RTLD_NOLOAD) : nullptr;
    }();
    static_cast<void>(own);
}

void* findSymbol(Module module, const char* symbol) {
    if (!module)
        return nullptr;
    void* address = ::dlsym(module, symbol);
    if (!address)
        return nullptr;
    // The search goes through the dependencies as well, whose symbols do not count.
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

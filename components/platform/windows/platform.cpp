// SPDX-License-Identifier: BSL-1.0
/// The platform functions for Windows.
///
/// File names are wide text here, and the system ignores their letter case, so the normalised path
/// opens a file. A library is loaded by its full path with an explicit extension, because the
/// loader would search other folders and append ".dll" otherwise.
#include "components/platform/platform.h"

#include "components/platform/windows/exportReader.h"

#include <clocale>
#include <cstring>
#include <cwchar>
#include <io.h>
#include <mutex>
#include <sys/stat.h>
#include <windows.h>

namespace Mz::platform {

namespace {

/// Returns the full path of `path`, relative to the current folder. The loader would search for a
/// relative one in the program's folder and elsewhere.
std::wstring fullName(const NativePath& path) {
    std::wstring full(MAX_PATH, L'\0');
    while (true) {
        const DWORD length =
            ::GetFullPathNameW(path.c_str(), static_cast<DWORD>(full.size()), full.data(), nullptr);
        if (length == 0)
            return path;
        const bool fits = length < full.size();
        full.resize(length);
        if (fits)
            return full;
    }
}

/// Returns the loader's form of a full path. The loader appends ".dll" to a name without an
/// extension, unless the name ends with a dot.
std::wstring loaderName(const std::wstring& name) {
    const std::size_t separator = name.find_last_of(L"/\\");
    const std::size_t dot = name.find_last_of(L'.');
    const bool hasExtension =
        dot != std::wstring::npos && (separator == std::wstring::npos || dot > separator);
    return hasExtension ? name : name + L".";
}

/// Activates the activation context of a library's own manifest on this thread, during the lifetime
/// of the object. A library without a manifest is loaded in the context of the caller.
class OwnActivationContext {
  public:
    /// `source` is the full path of the library.
    explicit OwnActivationContext(const std::wstring& source) {
        constexpr int isolationAwareManifest = 2;
        ACTCTXW request{};
        request.cbSize = sizeof request;
        request.dwFlags = ACTCTX_FLAG_RESOURCE_NAME_VALID;
        request.lpSource = source.c_str();
        request.lpResourceName = MAKEINTRESOURCEW(isolationAwareManifest);
        context = ::CreateActCtxW(&request);
        if (context != INVALID_HANDLE_VALUE)
            active = ::ActivateActCtx(context, &cookie);
    }
    ~OwnActivationContext() {
        if (active)
            ::DeactivateActCtx(0, cookie);
        if (context != INVALID_HANDLE_VALUE)
            ::ReleaseActCtx(context);
    }
    OwnActivationContext(const OwnActivationContext&) = delete;
    OwnActivationContext& operator=(const OwnActivationContext&) = delete;

  private:
    HANDLE context;
    ULONG_PTR cookie = 0;
    bool active = false;
};

/// An open directory listing of the C runtime.
class Listing {
  public:
    explicit Listing(const std::wstring& pattern)
        : handle(::_wfindfirst64i32(pattern.c_str(), &entry)) {}
    ~Listing() {
        if (handle != -1)
            ::_findclose(handle);
    }
    Listing(const Listing&) = delete;
    Listing& operator=(const Listing&) = delete;

    bool valid() const { return handle != -1; }
    bool next() { return ::_wfindnext64i32(handle, &entry) == 0; }
    const _wfinddata64i32_t& current() const { return entry; }

  private:
    _wfinddata64i32_t entry{};
    std::intptr_t handle;
};

/// Returns the candidates of one directory, in the order of the system.
std::vector<DirectoryEntry> list(const NativePath& directory) {
    std::vector<DirectoryEntry> entries;
    Listing listing(directory + L"/*");
    if (!listing.valid())
        return entries;
    constexpr unsigned int excluded = _A_HIDDEN | _A_SYSTEM | _A_SUBDIR;
    do {
        const _wfinddata64i32_t& entry = listing.current();
        if (!(entry.attrib & excluded))
            entries.push_back({entry.name, directory + L"\\" + entry.name, std::nullopt});
    } while (listing.next());
    return entries;
}

/// Returns whether the memory at `address` is executable.
bool isCode(const void* address) {
    constexpr DWORD executable =
        PAGE_EXECUTE | PAGE_EXECUTE_READ | PAGE_EXECUTE_READWRITE | PAGE_EXECUTE_WRITECOPY;
    MEMORY_BASIC_INFORMATION memory{};
    return ::VirtualQuery(address, &memory, sizeof memory) != 0 &&
           (memory.Protect & executable) != 0;
}

/// Maps the library at a full path without running its code, and returns whether it exports the
/// function.
bool exportsWhenMapped(const std::wstring& name, const char* symbol) {
    const HMODULE module =
        ::LoadLibraryExW(loaderName(name).c_str(), nullptr, DONT_RESOLVE_DLL_REFERENCES);
    const bool found = findSymbol(module, symbol) != nullptr;
    unloadLibrary(module);
    return found;
}

/// Loads the library at a full path; returns null if it cannot be loaded.
Module load(const std::wstring& name) {
    const HMODULE module = ::LoadLibraryW(loaderName(name).c_str());
    if (!module)
        static_cast<void>(::GetLastError()); // Discards the reason.
    return module;
}

bool isDirectory(const NativePath& path) {
    struct _stat64 status;
    return ::_wstat64(path.c_str(), &status) == 0 && (status.st_mode & S_IFMT) == S_IFDIR;
}

} // namespace

std::optional<NativePath> toNative(std::wstring_view name) {
    return NativePath(std::wstring(name));
}

NativePath openingPath(std::wstring_view directory, std::wstring_view name, const NativePath&) {
    NativePath path(directory);
    if (!name.empty())
        path.append(1, L'\\').append(name);
    return path;
}

std::wstring lowerCase(std::wstring text) {
    ::_wcslwr(text.data());
    return text;
}

bool namesIgnoreCase() {
    return true;
}

std::optional<std::wstring> firstArgument() {
    // The C runtime has no wide arguments in a program with a narrow `main`. In the first argument
    // a quote only starts or ends quoting, and there are no escapes.
    std::wstring argument;
    bool quoted = false;
    for (const wchar_t* next = ::GetCommandLineW(); *next; ++next) {
        if (*next == L'"')
            quoted = !quoted;
        else if (!quoted && (*next == L' ' || *next == L'\t'))
            break;
        else
            argument += *next;
    }
    return argument;
}

std::optional<FileStatus> queryFile(const NativePath& path, bool* unknown) {
    if (unknown)
        *unknown = false;
    struct _stat64 status;
    if (::_wstat64(path.c_str(), &status) != 0)
        return std::nullopt;
    return FileStatus{static_cast<std::uint32_t>(status.st_mtime), status.st_size,
                      (status.st_mode & S_IFMT) == S_IFREG};
}

bool isSameFile(const NativePath& a, const NativePath& b) {
    return a == b;
}

std::vector<std::vector<DirectoryEntry>> listCandidates(const std::vector<NativePath>& directories,
                                                        std::vector<bool>* unlisted) {
    if (unlisted)
        unlisted->assign(directories.size(), false);
    std::vector<std::vector<DirectoryEntry>> entries;
    entries.reserve(directories.size());
    for (const NativePath& directory : directories)
        entries.push_back(list(directory));
    return entries;
}

bool openForReading(std::ifstream& stream, const NativePath& path) {
    if (isDirectory(path))
        stream.setstate(std::ios::failbit);
    else
        stream.open(std::filesystem::path(path), std::ios::in | std::ios::binary);
    return stream.good();
}

Module findLoadedLibrary(const NativePath& path) {
    return ::GetModuleHandleW(loaderName(fullName(path)).c_str());
}

ExportState queryExport(const NativePath& path, const char* symbol) {
    const std::wstring name = fullName(path);
    const ExportState state = readExport(name, symbol);
    if (state != ExportState::exported)
        return state;
    const OwnActivationContext context(name);
    return exportsWhenMapped(name, symbol) ? ExportState::exported : ExportState::absent;
}

Module loadLibrary(const NativePath& path) {
    const std::wstring name = fullName(path);
    const OwnActivationContext context(name);
    return load(name);
}

// The probe and the load share one activation context: making one maps the file, and looks for a
// manifest beside it.
UsedLibrary useLibrary(const NativePath& path, const char* symbol) {
    if (const Module mapped = findLoadedLibrary(path))
        return {mapped, false, false};
    const std::wstring name = fullName(path);
    const ExportState state = readExport(name, symbol);
    if (state != ExportState::exported)
        return {nullptr, false, state == ExportState::unknown};
    const OwnActivationContext context(name);
    const Module module = exportsWhenMapped(name, symbol) ? load(name) : nullptr;
    return {module, module != nullptr, false};
}

void unloadLibrary(Module module) {
    if (module)
        ::FreeLibrary(static_cast<HMODULE>(module));
}

// The system unloads nothing while a process ends. Until then the components keep it loaded.
void pinThisLibrary() {}

void* findSymbol(Module module, const char* symbol) {
    if (!module)
        return nullptr;
    const auto address =
        reinterpret_cast<void*>(::GetProcAddress(static_cast<HMODULE>(module), symbol));
    if (!address)
        return nullptr;
    // An export may be forwarded to another library, whose symbols do not count.
    HMODULE owner = nullptr;
    constexpr DWORD flags =
        GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT;
    if (!::GetModuleHandleExW(flags, static_cast<const wchar_t*>(address), &owner))
        return nullptr;
    return owner == module && isCode(address) ? address : nullptr;
}

QuietErrors::QuietErrors()
    : previousMode(::SetErrorMode(SEM_FAILCRITICALERRORS | SEM_NOOPENFILEERRORBOX)) {}

QuietErrors::~QuietErrors() {
    ::SetErrorMode(previousMode);
}

std::uint32_t currentThreadId() {
    return ::GetCurrentThreadId();
}

void aroundForks(void (*)(), void (*)(), void (*)()) {}

bool usesPlainBytes() {
    const char* name = std::setlocale(LC_CTYPE, nullptr);
    return name && (std::strcmp(name, "C") == 0 || std::strcmp(name, "POSIX") == 0);
}

LocaleSwitch::LocaleSwitch() = default;

namespace {

/// Locks the shared state. Uses a system lock, because a mutex of the standard library allocates
/// memory on this system.
class LocaleSwitchLock {
  public:
    explicit LocaleSwitchLock(LocaleSwitch& shared)
        : handle(reinterpret_cast<PSRWLOCK>(&shared.lock)) {
        static_assert(sizeof(SRWLOCK) == sizeof shared.lock);
        ::AcquireSRWLockExclusive(handle);
    }
    ~LocaleSwitchLock() { ::ReleaseSRWLockExclusive(handle); }
    LocaleSwitchLock(const LocaleSwitchLock&) = delete;
    LocaleSwitchLock& operator=(const LocaleSwitchLock&) = delete;

  private:
    PSRWLOCK handle;
};

} // namespace

CLocale::CLocale(LocaleSwitch& shared) : shared(shared) {
    const LocaleSwitchLock guard(shared);
    if (shared.useCount == 0) {
        const wchar_t* current = ::_wsetlocale(LC_ALL, nullptr);
        shared.previous = current ? current : L"C";
        if (shared.previous != L"C")
            ::_wsetlocale(LC_ALL, L"C");
    }
    ++shared.useCount;
}

CLocale::~CLocale() {
    const LocaleSwitchLock guard(shared);
    if (--shared.useCount > 0)
        return;
    if (shared.previous != L"C")
        ::_wsetlocale(LC_ALL, shared.previous.c_str());
    shared.previous = std::wstring();
}

} // namespace Mz::platform

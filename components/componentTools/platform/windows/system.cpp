// SPDX-License-Identifier: BSL-1.0
/// Dependencies are searched with `SearchPathW`, which uses the order of the loader but loads
/// nothing. A vectored handler records faults, because the loader catches crashes in initialisers
/// and reports only an error.
#include "components/componentTools/platform/system.h"

#include "components/componentManager/componentImp.h"
#include "components/componentManager/files.h"
#include "components/componentManager/nativeText.h"
#include "components/componentManager/utf8.h"
#include "components/platform/platform.h"

#include "components/componentTools/platform/windows/faultName.h"

#include <atomic>
#include <charconv>
#include <ext/stdio_filebuf.h>
#include <fcntl.h>
#include <io.h>
#include <windows.h>

#include <shellapi.h>

namespace Mz::Tools::System {

namespace {

std::string toBytes(const std::wstring& text, UINT encoding) {
    const int length = static_cast<int>(text.size());
    const int size =
        ::WideCharToMultiByte(encoding, 0, text.data(), length, nullptr, 0, nullptr, nullptr);
    std::string bytes(static_cast<std::size_t>(size), '\0');
    ::WideCharToMultiByte(encoding, 0, text.data(), length, bytes.data(), size, nullptr, nullptr);
    return bytes;
}

std::wstring toCharacters(const std::string& bytes, UINT encoding) {
    const int length = static_cast<int>(bytes.size());
    const int size = ::MultiByteToWideChar(encoding, 0, bytes.data(), length, nullptr, 0);
    std::wstring text(static_cast<std::size_t>(size), L'\0');
    ::MultiByteToWideChar(encoding, 0, bytes.data(), length, text.data(), size);
    return text;
}

/// Returns whether the name is an API set. The system resolves these names without files.
bool isVirtual(const std::wstring& name) {
    const std::wstring lower = platform::lowerCase(name);
    return lower.starts_with(L"api-ms-") || lower.starts_with(L"ext-ms-");
}

bool isFile(const NativePath& path) {
    const DWORD attributes = ::GetFileAttributesW(path.c_str());
    return attributes != INVALID_FILE_ATTRIBUTES && !(attributes & FILE_ATTRIBUTE_DIRECTORY);
}

/// The code of the last fault in this process that `isFault` accepts.
std::atomic<DWORD> lastFault{0};

bool isFault(DWORD code) {
    switch (code) {
    case EXCEPTION_ACCESS_VIOLATION:
    case EXCEPTION_ILLEGAL_INSTRUCTION:
    case EXCEPTION_PRIV_INSTRUCTION:
    case EXCEPTION_IN_PAGE_ERROR:
    case EXCEPTION_INT_DIVIDE_BY_ZERO:
    case EXCEPTION_STACK_OVERFLOW: return true;
    default: return false;
    }
}

/// The original standard output; null before `reserveOutput`.
HANDLE reservedOutput = nullptr;

LONG WINAPI noteFault(EXCEPTION_POINTERS* fault) {
    const DWORD code = fault->ExceptionRecord->ExceptionCode;
    if (isFault(code))
        lastFault = code;
    return EXCEPTION_CONTINUE_SEARCH;
}

LONG WINAPI endWithFault(EXCEPTION_POINTERS* fault) {
    ::TerminateProcess(::GetCurrentProcess(), fault->ExceptionRecord->ExceptionCode);
    return EXCEPTION_EXECUTE_HANDLER;
}

} // namespace

std::wstring displayName(const NativePath& path) {
    return Mz::displayName(path);
}

std::string encode(const std::wstring& text, int stream) {
    DWORD mode = 0;
    const HANDLE handle = stream == 1 && reservedOutput
                              ? reservedOutput
                              : ::GetStdHandle(stream == 1 ? STD_OUTPUT_HANDLE : STD_ERROR_HANDLE);
    return toBytes(text, ::GetConsoleMode(handle, &mode) ? ::GetConsoleOutputCP() : CP_ACP);
}

std::vector<std::string> arguments(int, char**) {
    std::vector<std::string> result;
    int count = 0;
    wchar_t** const values = ::CommandLineToArgvW(::GetCommandLineW(), &count);
    for (int index = 1; index < count; ++index)
        result.push_back(toUtf8(values[index]));
    ::LocalFree(values);
    return result;
}

NativePath pathOfArgument(const std::string& argument) {
    return fromUtf8(argument);
}

ImageFormat ownFormat() {
    return ImageFormat::pe;
}

FileAttributes fileAttributes(const NativePath& path) {
    const DWORD attributes = ::GetFileAttributesW(path.c_str());
    if (attributes == INVALID_FILE_ATTRIBUTES)
        return {};
    return {(attributes & FILE_ATTRIBUTE_HIDDEN) != 0, (attributes & FILE_ATTRIBUTE_SYSTEM) != 0,
            (attributes & FILE_ATTRIBUTE_DIRECTORY) != 0};
}

std::optional<NativePath> findFolder(const std::wstring& normalised) {
    const DWORD attributes = ::GetFileAttributesW(normalised.c_str());
    if (attributes == INVALID_FILE_ATTRIBUTES || !(attributes & FILE_ATTRIBUTE_DIRECTORY))
        return std::nullopt;
    return normalised;
}

const wchar_t* loaderPathVariable() {
    return L"PATH";
}

Located findDependency(const std::string& name, const Needer&, const NativePath& programFolder) {
    const std::wstring wide = toCharacters(name, CP_ACP);
    if (isVirtual(wide))
        return {true, {}};
    if (!programFolder.empty() && isFile(programFolder / wide))
        return {true, programFolder / wide};
    wchar_t path[32768];
    const DWORD length = ::SearchPathW(nullptr, wide.c_str(), L".dll", 32768, path, nullptr);
    if (length > 0 && length < 32768)
        return {true, path};
    return {::GetModuleHandleW(wide.c_str()) != nullptr, {}};
}

namespace {

std::wstring textOfError(DWORD number) {
    // The loader returns the code of the exception that it caught; this is GCC's for C++.
    constexpr DWORD exceptionOfCpp = 0x20474343;
    if (number == exceptionOfCpp)
        return L"its initialisers let an exception out";
    wchar_t text[512];
    DWORD length = ::FormatMessageW(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS,
                                    nullptr, number, 0, text, 512, nullptr);
    while (length > 0 && (text[length - 1] <= L' ' || text[length - 1] == L'.'))
        --length;
    return std::wstring(text, length) + L" (" + std::to_wstring(number) + L")";
}

} // namespace

std::wstring loaderError(const NativePath& path) {
    const std::wstring name = path.native() + (path.has_extension() ? L"" : L".");
    if (::LoadLibraryW(name.c_str()))
        return L"it loads at the second attempt";
    return textOfError(::GetLastError());
}

namespace {

/// Returns the file of the library or program that contains a function.
NativePath fileOf(const void* function) {
    HMODULE module = nullptr;
    constexpr DWORD flags =
        GET_MODULE_HANDLE_EX_FLAG_FROM_ADDRESS | GET_MODULE_HANDLE_EX_FLAG_UNCHANGED_REFCOUNT;
    if (!::GetModuleHandleExW(flags, static_cast<const wchar_t*>(function), &module))
        return {};
    wchar_t path[32768];
    const DWORD length = ::GetModuleFileNameW(module, path, 32768);
    return NativePath(std::wstring(path, length));
}

} // namespace

NativePath moduleFolder() {
    return fileOf(reinterpret_cast<const void*>(&moduleFolder)).parent_path();
}

NativePath managerFile() {
    return fileOf(reinterpret_cast<const void*>(&QrGetComponentManager));
}

// Not by SearchPathW: that looks in the current folder, too, which others may be able to write to.
NativePath findProgram(const std::string& name) {
    std::wstring file = toCharacters(name, CP_ACP);
    if (!platform::lowerCase(file).ends_with(L".exe"))
        file += L".exe";
    for (std::wstring rest = environmentPath("PATH").value_or(NativePath()).native();
         !rest.empty();) {
        const std::size_t end = rest.find(L';');
        const NativePath program = NativePath(rest.substr(0, end)) / file;
        if (program.is_absolute() && isFile(program))
            return program;
        rest.erase(0, end == std::wstring::npos ? end : end + 1);
    }
    return {};
}

const char* programExtension() {
    return ".exe";
}

AnswerPipe::AnswerPipe(bool) {
    HANDLE pipe = INVALID_HANDLE_VALUE;
    const HANDLE self = ::GetCurrentProcess();
    ::DuplicateHandle(self, ::GetStdHandle(STD_OUTPUT_HANDLE), self, &pipe, 0, FALSE,
                      DUPLICATE_SAME_ACCESS);
    handle = reinterpret_cast<std::intptr_t>(pipe);
    const int nowhere = ::_open("NUL", _O_WRONLY);
    if (nowhere >= 0) {
        ::_dup2(nowhere, 1);
        ::_dup2(nowhere, 2);
        ::SetStdHandle(STD_OUTPUT_HANDLE, reinterpret_cast<HANDLE>(::_get_osfhandle(1)));
        ::SetStdHandle(STD_ERROR_HANDLE, reinterpret_cast<HANDLE>(::_get_osfhandle(2)));
        ::_close(nowhere);
    }
}

void AnswerPipe::write(const char* data, std::size_t size) {
    while (size > 0) {
        DWORD written = 0;
        const DWORD piece = static_cast<DWORD>(size < 65536 ? size : 65536);
        if (!::WriteFile(reinterpret_cast<HANDLE>(handle), data, piece, &written, nullptr) ||
            written == 0)
            return;
        data += written;
        size -= written;
    }
}

InputPipe::InputPipe() {
    HANDLE pipe = INVALID_HANDLE_VALUE;
    const HANDLE self = ::GetCurrentProcess();
    ::DuplicateHandle(self, ::GetStdHandle(STD_INPUT_HANDLE), self, &pipe, 0, FALSE,
                      DUPLICATE_SAME_ACCESS);
    handle = reinterpret_cast<std::intptr_t>(pipe);
    const int nowhere = ::_open("NUL", _O_RDONLY);
    if (nowhere >= 0) {
        ::_dup2(nowhere, 0);
        ::SetStdHandle(STD_INPUT_HANDLE, reinterpret_cast<HANDLE>(::_get_osfhandle(0)));
        ::_close(nowhere);
    }
}

std::size_t InputPipe::read(char* data, std::size_t size) {
    DWORD got = 0;
    const DWORD piece = static_cast<DWORD>(size < 65536 ? size : 65536);
    return ::ReadFile(reinterpret_cast<HANDLE>(handle), data, piece, &got, nullptr) ? got : 0;
}

bool takeInheritedFile(const std::string& argument, std::ifstream& stream) {
    std::intptr_t number = -1;
    std::from_chars(argument.data(), argument.data() + argument.size(), number);
    const int descriptor = ::_open_osfhandle(number, _O_RDONLY | _O_BINARY);
    if (descriptor < 0)
        return false;
    __gnu_cxx::stdio_filebuf<char> buffer(descriptor, std::ios::in | std::ios::binary);
    if (!buffer.is_open())
        return false;
    *stream.rdbuf() = std::move(static_cast<std::filebuf&>(buffer));
    return true;
}

int reserveOutput() {
    const int reserved = ::_dup(1);
    if (reserved >= 0)
        reservedOutput = reinterpret_cast<HANDLE>(::_get_osfhandle(reserved));
    int elsewhere = 2;
    if (::_get_osfhandle(elsewhere) < 0)
        elsewhere = ::_open("NUL", _O_WRONLY);
    if (elsewhere >= 0 && ::_dup2(elsewhere, 1) == 0)
        ::SetStdHandle(STD_OUTPUT_HANDLE, reinterpret_cast<HANDLE>(::_get_osfhandle(1)));
    return reserved;
}

bool writeReserved(int descriptor, const char* data, std::size_t size) {
    while (size > 0) {
        const unsigned int piece = static_cast<unsigned int>(size < 16384 ? size : 16384);
        const int written = ::_write(descriptor, data, piece);
        if (written <= 0)
            return false;
        data += written;
        size -= static_cast<std::size_t>(written);
    }
    return true;
}

void resetChildSignal() {}

BlockedSignals::BlockedSignals() = default;
BlockedSignals::~BlockedSignals() = default;

void confine(std::uint64_t) {
    ::SetErrorMode(SEM_FAILCRITICALERRORS | SEM_NOGPFAULTERRORBOX | SEM_NOOPENFILEERRORBOX);
    ::AddVectoredExceptionHandler(1, noteFault);
    ::SetUnhandledExceptionFilter(endWithFault);
}

void endProcess(int status) {
    ::TerminateProcess(::GetCurrentProcess(), static_cast<UINT>(status));
    for (;;)
        ::Sleep(INFINITE);
}

std::wstring caughtFault() {
    const DWORD code = lastFault;
    return code ? faultName(code) : std::wstring();
}

unsigned long processNumber() {
    return ::GetCurrentProcessId();
}

} // namespace Mz::Tools::System

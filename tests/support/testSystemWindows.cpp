// SPDX-License-Identifier: BSL-1.0
// The functions for Windows.
#include "tests/support/testSystem.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <iterator>
#include <malloc.h>
#include <windows.h>

#include <tlhelp32.h>

namespace Mz::Test {

namespace {

std::wstring widened(const std::string& text) {
    return std::filesystem::path(text).wstring();
}

std::wstring fullName(const std::filesystem::path& path) {
    std::wstring name = std::filesystem::absolute(path).lexically_normal().wstring();
    std::replace(name.begin(), name.end(), L'/', L'\\');
    return name;
}

/// Without the final dot, the loader would append ".dll" to a name without an extension.
std::wstring loaderName(const std::filesystem::path& path) {
    return fullName(path) + (path.has_extension() ? L"" : L".");
}

std::wstring quoted(const std::string& argument) {
    return L"\"" + widened(argument) + L"\"";
}

} // namespace

bool isMapped(const std::filesystem::path& library) {
    return ::GetModuleHandleW(loaderName(library).c_str()) != nullptr;
}

void* loadAsHost(const std::filesystem::path& library) {
    return ::LoadLibraryW(loaderName(library).c_str());
}

void unloadAsHost(void* module) {
    ::FreeLibrary(static_cast<HMODULE>(module));
}

void* functionOf(void* module, const char* name) {
    return reinterpret_cast<void*>(::GetProcAddress(static_cast<HMODULE>(module), name));
}

std::size_t allocatedBytes() {
    std::size_t bytes = 0;
    _HEAPINFO entry{};
    while (::_heapwalk(&entry) == _HEAPOK)
        if (entry._useflag == _USEDENTRY)
            bytes += entry._size;
    return bytes;
}

std::size_t openHandles() {
    DWORD count = 0;
    ::GetProcessHandleCount(::GetCurrentProcess(), &count);
    return count;
}

int exitCodeOfCopy() {
    return 0;
}

std::filesystem::path hide(const std::filesystem::path& file) {
    ::SetFileAttributesW(file.c_str(), FILE_ATTRIBUTE_HIDDEN);
    return file;
}

namespace {

/// Returns the time at which a process began.
ULONGLONG beginOf(HANDLE process) {
    FILETIME begin{}, end, kernel, user;
    ::GetProcessTimes(process, &begin, &end, &kernel, &user);
    return ULONGLONG{begin.dwHighDateTime} << 32 | begin.dwLowDateTime;
}

/// Returns whether a process runs that began after this one. One that has this process's number for
/// its parent's but is older belonged to another process, which has ended.
bool isYoungerAndRuns(DWORD number) {
    const HANDLE process =
        ::OpenProcess(PROCESS_QUERY_LIMITED_INFORMATION | SYNCHRONIZE, FALSE, number);
    if (!process)
        return false;
    const bool result = ::WaitForSingleObject(process, 0) == WAIT_TIMEOUT &&
                        beginOf(process) >= beginOf(::GetCurrentProcess());
    ::CloseHandle(process);
    return result;
}

} // namespace

bool hasChildProcess() {
    const HANDLE processes = ::CreateToolhelp32Snapshot(TH32CS_SNAPPROCESS, 0);
    PROCESSENTRY32W entry{};
    entry.dwSize = sizeof entry;
    bool found = false;
    for (BOOL more = ::Process32FirstW(processes, &entry); more && !found;
         more = ::Process32NextW(processes, &entry))
        found = entry.th32ParentProcessID == ::GetCurrentProcessId() &&
                isYoungerAndRuns(entry.th32ProcessID);
    ::CloseHandle(processes);
    return found;
}

void setEnvironment(const std::string& name, const std::string& value) {
    // Sets the variable for the system and for the C runtime.
    ::_wputenv((widened(name) + L"=" + widened(value)).c_str());
}

std::wstring searchPathOf(const std::filesystem::path& path) {
    return fullName(path);
}

bool reserveAddresses(std::uint64_t size, bool writable) {
    return ::VirtualAlloc(nullptr, size, MEM_RESERVE, writable ? PAGE_READWRITE : PAGE_NOACCESS) !=
           nullptr;
}

bool useSharedMemory(std::uint64_t size) {
    const HANDLE section =
        ::CreateFileMappingW(INVALID_HANDLE_VALUE, nullptr, PAGE_READWRITE,
                             static_cast<DWORD>(size >> 32), static_cast<DWORD>(size), nullptr);
    void* const memory = section ? ::MapViewOfFile(section, FILE_MAP_WRITE, 0, 0, size) : nullptr;
    if (!memory)
        return false;
    std::memset(memory, 1, size);
    return true;
}

namespace {

/// Calls `action` with the handle of each pipe.
template <class Action>
void forEachPipe(Action action) {
    for (std::uintptr_t number = 4; number < 0x1000; number += 4) {
        const HANDLE handle = reinterpret_cast<HANDLE>(number);
        if (::GetFileType(handle) == FILE_TYPE_PIPE)
            action(handle);
    }
}

} // namespace

void closePipes() {
    forEachPipe([](HANDLE handle) { ::CloseHandle(handle); });
}

void writeToPipes(const std::string& bytes) {
    forEachPipe([&](HANDLE handle) {
        DWORD written = 0;
        for (std::size_t done = 0; done < bytes.size(); done += written)
            if (!::WriteFile(handle, bytes.data() + done, static_cast<DWORD>(bytes.size() - done),
                             &written, nullptr) ||
                written == 0)
                return;
    });
}

ProgramResult runProgram(const std::filesystem::path& program, const std::string& firstArgument,
                         const std::vector<std::string>& arguments,
                         const std::filesystem::path& workingDirectory) {
    ProgramResult result;
    std::wstring commandLine = quoted(firstArgument);
    for (const std::string& argument : arguments)
        commandLine += L" " + quoted(argument);
    // The shared libraries are in the folder of the running test.
    wchar_t own[MAX_PATH];
    ::GetModuleFileNameW(nullptr, own, MAX_PATH);
    ::SetEnvironmentVariableW(L"PATH", std::filesystem::path(own).parent_path().c_str());

    const std::filesystem::path outputFile =
        std::filesystem::temp_directory_path() /
        ("mz-output-" + std::to_string(::GetCurrentProcessId()) + ".txt");
    SECURITY_ATTRIBUTES inherited{sizeof inherited, nullptr, TRUE};
    const HANDLE output = ::CreateFileW(outputFile.c_str(), GENERIC_WRITE, FILE_SHARE_READ,
                                        &inherited, CREATE_ALWAYS, 0, nullptr);
    STARTUPINFOW startup{};
    startup.cb = sizeof startup;
    startup.dwFlags = STARTF_USESTDHANDLES;
    startup.hStdOutput = output;
    startup.hStdError = ::GetStdHandle(STD_ERROR_HANDLE);
    startup.hStdInput = ::GetStdHandle(STD_INPUT_HANDLE);
    PROCESS_INFORMATION process{};
    const bool started =
        ::CreateProcessW(fullName(program).c_str(), commandLine.data(), nullptr, nullptr, TRUE, 0,
                         nullptr, fullName(workingDirectory).c_str(), &startup, &process);
    ::CloseHandle(output);
    if (started) {
        ::WaitForSingleObject(process.hProcess, INFINITE);
        DWORD code = 0;
        ::GetExitCodeProcess(process.hProcess, &code);
        // Programs return codes below 256. The system uses greater codes; `abort` of the C runtime
        // uses 3.
        result.finished = code < 256 && code != 3;
        result.exitCode = static_cast<int>(code);
        ::CloseHandle(process.hThread);
        ::CloseHandle(process.hProcess);
    }
    std::ifstream file(outputFile, std::ios::binary);
    result.output.assign(std::istreambuf_iterator<char>(file), {});
    file.close();
    std::erase(result.output, '\r');
    std::filesystem::remove(outputFile);
    return result;
}

} // namespace Mz::Test

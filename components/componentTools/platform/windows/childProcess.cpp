// SPDX-License-Identifier: BSL-1.0
/// A job kills the child, and the processes that it starts, when `runChild` returns or the parent
/// ends. The parent polls time, output and memory. The job's memory limit is only for memory that
/// is taken faster than that, and Wine does not enforce it. The child's standard input is a named
/// pipe, because an anonymous one cannot be written without blocking.
#include "components/componentTools/platform/system.h"

#include "components/platform/platform.h"

#include "components/componentTools/platform/windows/faultName.h"

#include <algorithm>
#include <atomic>
#include <cwchar>
#include <optional>
#include <windows.h>

#include <psapi.h>

namespace Mz::Tools::System {

namespace {

using Clock = std::chrono::steady_clock;

/// The polling interval of the child, in milliseconds; and that of one that waits for answers.
constexpr DWORD pause = 10, shortPause = 1;

class Handle {
  public:
    explicit Handle(HANDLE handle = nullptr) : value(handle) {}
    ~Handle() { close(); }
    Handle(const Handle&) = delete;
    Handle& operator=(const Handle&) = delete;
    HANDLE get() const { return value; }
    HANDLE* out() { return &value; }
    explicit operator bool() const { return value && value != INVALID_HANDLE_VALUE; }
    void close() {
        if (*this)
            ::CloseHandle(value);
        value = nullptr;
    }

  private:
    HANDLE value;
};

/// Returns `argument` quoted, so that programs parse it back from a command line.
std::wstring quoted(const std::wstring& argument) {
    std::wstring result = L"\"";
    std::size_t slashes = 0;
    for (const wchar_t character : argument) {
        if (character == L'"')
            result.append(slashes + 1, L'\\');
        slashes = character == L'\\' ? slashes + 1 : 0;
        result += character;
    }
    result.append(slashes, L'\\');
    return result + L'"';
}

/// The list of the only handles that a child inherits.
class Inherited {
  public:
    explicit Inherited(std::vector<HANDLE> wanted) : handles(std::move(wanted)) {
        SIZE_T size = 0;
        ::InitializeProcThreadAttributeList(nullptr, 1, 0, &size);
        memory.resize(size);
        list = reinterpret_cast<LPPROC_THREAD_ATTRIBUTE_LIST>(memory.data());
        ::InitializeProcThreadAttributeList(list, 1, 0, &size);
        ::UpdateProcThreadAttribute(list, 0, PROC_THREAD_ATTRIBUTE_HANDLE_LIST, handles.data(),
                                    handles.size() * sizeof(HANDLE), nullptr, nullptr);
    }
    ~Inherited() { ::DeleteProcThreadAttributeList(list); }
    Inherited(const Inherited&) = delete;
    Inherited& operator=(const Inherited&) = delete;
    LPPROC_THREAD_ATTRIBUTE_LIST get() const { return list; }

  private:
    std::vector<HANDLE> handles;
    std::vector<char> memory;
    LPPROC_THREAD_ATTRIBUTE_LIST list;
};

/// Returns a new job, which kills its processes when its handle is closed. Unless `refused` is 0,
/// the system limits the memory that each of its processes can commit, in bytes.
HANDLE newJob(std::uint64_t refused) {
    const HANDLE job = ::CreateJobObjectW(nullptr, nullptr);
    JOBOBJECT_EXTENDED_LIMIT_INFORMATION limit{};
    limit.BasicLimitInformation.LimitFlags =
        JOB_OBJECT_LIMIT_KILL_ON_JOB_CLOSE | JOB_OBJECT_LIMIT_DIE_ON_UNHANDLED_EXCEPTION;
    if (refused) {
        limit.BasicLimitInformation.LimitFlags |= JOB_OBJECT_LIMIT_PROCESS_MEMORY;
        limit.ProcessMemoryLimit = static_cast<SIZE_T>(refused);
    }
    ::SetInformationJobObject(job, JobObjectExtendedLimitInformation, &limit, sizeof limit);
    return job;
}

/// Returns the environment of this process with more variables, which replace those of the same
/// name: texts that end with NUL, and another NUL. The system takes them in any order.
std::wstring environmentWith(const std::vector<std::pair<std::string, NativePath>>& added) {
    std::wstring block;
    for (const auto& [name, value] : added)
        block += std::wstring(name.begin(), name.end()) + L'=' + value.native() + L'\0';
    wchar_t* const own = ::GetEnvironmentStringsW();
    for (const wchar_t* variable = own; *variable; variable += std::wcslen(variable) + 1) {
        const bool replaced = std::any_of(added.begin(), added.end(), [&](const auto& entry) {
            const std::wstring name(entry.first.begin(), entry.first.end());
            return std::wcslen(variable) > name.size() && variable[name.size()] == L'=' &&
                   ::_wcsnicmp(variable, name.c_str(), name.size()) == 0;
        });
        if (!replaced)
            block.append(variable).push_back(L'\0');
    }
    ::FreeEnvironmentStringsW(own);
    block.push_back(L'\0');
    return block;
}

/// The end of the child's standard input at which this process writes. At most one write is under
/// way.
class InputWriter {
  public:
    /// Opens both ends.
    /// \param childEnd  receives the other end, which a child can inherit
    explicit InputWriter(HANDLE* childEnd) {
        static std::atomic<unsigned int> count{0};
        const std::wstring name = L"\\\\.\\pipe\\mzcomponents-" +
                                  std::to_wstring(::GetCurrentProcessId()) + L"-" +
                                  std::to_wstring(++count);
        pipe = ::CreateNamedPipeW(name.c_str(),
                                  PIPE_ACCESS_OUTBOUND | FILE_FLAG_OVERLAPPED |
                                      FILE_FLAG_FIRST_PIPE_INSTANCE,
                                  PIPE_TYPE_BYTE | PIPE_WAIT, 1, 65536, 65536, 0, nullptr);
        SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
        *childEnd =
            ::CreateFileW(name.c_str(), GENERIC_READ, 0, &inheritable, OPEN_EXISTING, 0, nullptr);
        state.hEvent = ::CreateEventW(nullptr, TRUE, FALSE, nullptr);
    }
    ~InputWriter() {
        DWORD ignored = 0;
        if (underWay && ::CancelIo(pipe))
            ::GetOverlappedResult(pipe, &state, &ignored, TRUE);
        if (pipe != INVALID_HANDLE_VALUE)
            ::CloseHandle(pipe);
        ::CloseHandle(state.hEvent);
    }
    InputWriter(const InputWriter&) = delete;
    InputWriter& operator=(const InputWriter&) = delete;

    /// Sends `bytes` as far as the child reads, and removes what was taken over.
    void send(std::string& bytes) {
        DWORD written = 0;
        while (underWay || !bytes.empty()) {
            if (underWay && !::GetOverlappedResult(pipe, &state, &written, FALSE)) {
                if (::GetLastError() == ERROR_IO_INCOMPLETE)
                    return;
                broken = true;
            }
            underWay = false;
            if (broken)
                return bytes.clear(); // The child has closed its standard input.
            piece.assign(bytes, 0, 65536);
            bytes.erase(0, piece.size());
            if (piece.empty())
                return;
            underWay = ::WriteFile(pipe, piece.data(), static_cast<DWORD>(piece.size()), nullptr,
                                   &state) ||
                       ::GetLastError() == ERROR_IO_PENDING;
            broken = !underWay;
        }
    }

  private:
    HANDLE pipe = INVALID_HANDLE_VALUE;
    OVERLAPPED state{};
    std::string piece; ///< must not change while a write is under way
    bool underWay = false, broken = false;
};

/// The handles of a child; null for none.
struct Files {
    HANDLE input, output, file;
};

bool start(const NativePath& program, const std::vector<NativePath>& arguments, const Files& files,
           HANDLE job, std::wstring environment, PROCESS_INFORMATION& process) {
    std::wstring commandLine = quoted(program.native());
    for (const NativePath& argument : arguments)
        commandLine += L" " + quoted(argument.native());
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    const Handle nowhere(::CreateFileW(L"NUL", GENERIC_READ | GENERIC_WRITE,
                                       FILE_SHARE_READ | FILE_SHARE_WRITE, &inheritable,
                                       OPEN_EXISTING, 0, nullptr));
    std::vector<HANDLE> handles{files.output, nowhere.get()};
    for (const HANDLE optional : {files.input, files.file})
        if (optional)
            handles.push_back(optional);
    const Inherited inherited(std::move(handles));
    STARTUPINFOEXW startup{};
    startup.StartupInfo.cb = sizeof startup;
    startup.StartupInfo.dwFlags = STARTF_USESTDHANDLES;
    startup.StartupInfo.hStdInput = files.input ? files.input : nowhere.get();
    startup.StartupInfo.hStdOutput = files.output;
    startup.StartupInfo.hStdError = nowhere.get();
    startup.lpAttributeList = inherited.get();
    constexpr DWORD flags = CREATE_SUSPENDED | CREATE_NO_WINDOW | CREATE_NEW_PROCESS_GROUP |
                            EXTENDED_STARTUPINFO_PRESENT | CREATE_UNICODE_ENVIRONMENT;
    const platform::QuietErrors quiet; // The child inherits the error mode.
    if (!::CreateProcessW(program.c_str(), commandLine.data(), nullptr, nullptr, TRUE, flags,
                          environment.data(), nullptr, &startup.StartupInfo, &process))
        return false;
    ::AssignProcessToJobObject(job, process.hProcess);
    ::ResumeThread(process.hThread);
    return true;
}

/// Watches one child until it ends. The destructor kills a child that still runs and waits for its
/// end, because the caller's `interrupted` and the growth of the output may throw.
class Watch {
  public:
    /// \param writer  for the child's standard input; null for none
    Watch(HANDLE process, HANDLE pipe, InputWriter* writer, const ChildLimits& allowed,
          const ChildSupply& supplied)
        : child(process), output(pipe), input(writer), limits(allowed), supply(supplied),
          end(Clock::now() + allowed.time) {}
    ~Watch() {
        if (::WaitForSingleObject(child, 0) != WAIT_TIMEOUT)
            return;
        ::TerminateProcess(child, 1);
        ::WaitForSingleObject(child, INFINITE);
    }
    Watch(const Watch&) = delete;
    Watch& operator=(const Watch&) = delete;

    ChildResult result() {
        while (::WaitForSingleObject(child, nextPause()) == WAIT_TIMEOUT)
            judge();
        readOutput();
        if (judged)
            return std::move(judgement);
        DWORD status = 0;
        ::GetExitCodeProcess(child, &status);
        // Exit statuses of programs are small; the system uses the codes of faults.
        constexpr DWORD firstFault = 0x80000000;
        if (mostMemory() >= limits.memory) {
            judgement.end = ChildResult::End::outOfMemory;
        } else if (status >= firstFault) {
            judgement.end = ChildResult::End::crashed;
            judgement.detail = faultName(status);
        } else {
            judgement.end = ChildResult::End::exited;
            judgement.status = static_cast<int>(status);
        }
        return std::move(judgement);
    }

  private:
    /// Transfers input and output. Returns how long to wait before the next time.
    DWORD nextPause() {
        if (judged)
            return INFINITE;
        if (input)
            input->send(*supply.input);
        if (readOutput())
            return 0;
        return input ? shortPause : pause;
    }

    /// Reads the available output, but not for ever, because the child may write faster. Returns
    /// whether there was any.
    bool readOutput() {
        bool any = false;
        constexpr int mostBlocks = 64;
        int count = 0;
        char block[65536];
        DWORD waiting = 0, got = 0;
        while (count++ < mostBlocks && judgement.output.size() <= limits.output &&
               ::PeekNamedPipe(output, nullptr, 0, nullptr, &waiting, nullptr) && waiting > 0 &&
               ::ReadFile(output, block, sizeof block, &got, nullptr) && got > 0) {
            judgement.output.append(block, got);
            if (limits.received)
                limits.received(judgement.output);
            if (limits.outputRestartsTime)
                end = Clock::now() + limits.time;
            any = true;
        }
        return any;
    }

    std::uint64_t mostMemory() {
        PROCESS_MEMORY_COUNTERS counters{};
        counters.cb = sizeof counters;
        if (::K32GetProcessMemoryInfo(child, &counters, sizeof counters))
            judgement.memory = std::max<std::uint64_t>(
                {judgement.memory, counters.PagefileUsage, counters.PeakPagefileUsage,
                 counters.WorkingSetSize, counters.PeakWorkingSetSize});
        return judgement.memory;
    }

    void judge() {
        if (judged)
            return;
        if (limits.complete && limits.complete())
            stop(ChildResult::End::complete);
        else if (limits.interrupted && limits.interrupted())
            stop(ChildResult::End::interrupted);
        else if (mostMemory() >= limits.memory)
            stop(ChildResult::End::outOfMemory);
        else if (judgement.output.size() > limits.output)
            stop(ChildResult::End::tooMuchOutput);
        else if (Clock::now() >= end)
            stop(ChildResult::End::timedOut);
    }

    void stop(ChildResult::End reason) {
        judgement.end = reason;
        judged = true;
        ::TerminateProcess(child, 1);
    }

    HANDLE child;
    HANDLE output;
    InputWriter* input;
    const ChildLimits& limits;
    const ChildSupply& supply;
    Clock::time_point end;
    ChildResult judgement;
    bool judged = false;
};

} // namespace

std::wstring faultName(unsigned long code) {
    switch (code) {
    case EXCEPTION_ACCESS_VIOLATION: return L"access to memory that is not there (0xC0000005)";
    case EXCEPTION_IN_PAGE_ERROR: return L"access to memory that has no content (0xC0000006)";
    case EXCEPTION_ILLEGAL_INSTRUCTION: return L"an instruction that does not exist (0xC000001D)";
    case EXCEPTION_PRIV_INSTRUCTION: return L"an instruction that is forbidden (0xC0000096)";
    case EXCEPTION_INT_DIVIDE_BY_ZERO: return L"an arithmetic fault (0xC0000094)";
    case EXCEPTION_STACK_OVERFLOW: return L"the stack is used up (0xC00000FD)";
    case EXCEPTION_BREAKPOINT: return L"a breakpoint (0x80000003)";
    default: break;
    }
    std::wstring digits;
    for (int shift = 28; shift >= 0; shift -= 4)
        digits += L"0123456789ABCDEF"[code >> shift & 15];
    return L"0x" + digits;
}

InheritableFile::InheritableFile(const NativePath& path) {
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    const HANDLE file = ::CreateFileW(path.c_str(), GENERIC_READ,
                                      FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE,
                                      &inheritable, OPEN_EXISTING, 0, nullptr);
    if (file != INVALID_HANDLE_VALUE && ::GetFileType(file) == FILE_TYPE_DISK)
        handle = reinterpret_cast<std::intptr_t>(file);
    else if (file != INVALID_HANDLE_VALUE)
        ::CloseHandle(file);
}

InheritableFile::~InheritableFile() {
    if (isOpen())
        ::CloseHandle(reinterpret_cast<HANDLE>(handle));
}

bool InheritableFile::isOpen() const {
    return handle != -1;
}

std::string InheritableFile::argument() const {
    return std::to_string(handle);
}

ChildResult runChild(const NativePath& program, const std::vector<NativePath>& arguments,
                     const ChildLimits& limits, const ChildSupply& supply) {
    ChildResult failed;
    SECURITY_ATTRIBUTES inheritable{sizeof inheritable, nullptr, TRUE};
    Handle output, childOutput, childInput;
    if (!::CreatePipe(output.out(), childOutput.out(), &inheritable, 65536)) {
        failed.detail = L"no pipe";
        return failed;
    }
    ::SetHandleInformation(output.get(), HANDLE_FLAG_INHERIT, 0);
    std::optional<InputWriter> input;
    if (supply.input)
        input.emplace(childInput.out());
    const Handle job(newJob(limits.refused));
    const Files files{childInput ? childInput.get() : nullptr, childOutput.get(),
                      supply.file ? reinterpret_cast<HANDLE>(supply.file->number()) : nullptr};
    PROCESS_INFORMATION process{};
    if (!start(program, arguments, files, job.get(), environmentWith(limits.environment),
               process)) {
        failed.detail = displayName(program) + L": error " + std::to_wstring(::GetLastError());
        return failed;
    }
    const Handle child(process.hProcess), thread(process.hThread);
    childOutput.close();
    childInput.close();
    return Watch(child.get(), output.get(), input ? &*input : nullptr, limits, supply).result();
}

} // namespace Mz::Tools::System

// SPDX-License-Identifier: BSL-1.0
/// The file functions for Windows.
///
/// A rename with `MOVEFILE_WRITE_THROUGH` replaces a file in one step. It fails while another
/// program has the file open, so it is retried for half a second.
#include "components/platform/files.h"

#include <windows.h>

#include <winioctl.h>

#include <cstdint>
#include <cstring>
#include <vector>

namespace Mz::platform {

namespace {

std::error_code errorOf(DWORD number) {
    return {static_cast<int>(number), std::system_category()};
}

std::error_code lastError() {
    return errorOf(::GetLastError());
}

/// A system handle, closed at the end.
class Handle {
  public:
    explicit Handle(HANDLE handle) : value(handle) {}
    ~Handle() {
        if (value != INVALID_HANDLE_VALUE)
            ::CloseHandle(value);
    }
    Handle(const Handle&) = delete;
    Handle& operator=(const Handle&) = delete;

    explicit operator bool() const { return value != INVALID_HANDLE_VALUE; }
    HANDLE get() const { return value; }

  private:
    HANDLE value;
};

/// Returns whether a retry may succeed: other programs, such as virus scanners, close files soon.
bool isInUse(DWORD error, const std::filesystem::path& file) {
    if (error != ERROR_ACCESS_DENIED && error != ERROR_SHARING_VIOLATION)
        return false;
    const DWORD attributes = ::GetFileAttributesW(file.c_str());
    return attributes == INVALID_FILE_ATTRIBUTES ||
           !(attributes & (FILE_ATTRIBUTE_DIRECTORY | FILE_ATTRIBUTE_READONLY));
}

} // namespace

std::error_code createNew(const std::filesystem::path& path, std::filesystem::perms) {
    const Handle file(::CreateFileW(path.c_str(), GENERIC_WRITE, 0, nullptr, CREATE_NEW,
                                    FILE_ATTRIBUTE_NORMAL, nullptr));
    if (file)
        return {};
    return ::GetLastError() == ERROR_FILE_EXISTS ? std::make_error_code(std::errc::file_exists)
                                                 : lastError();
}

std::error_code syncFile(const std::filesystem::path& path, std::optional<std::filesystem::perms>) {
    // The only permission on this system is "read-only", and a read-only file cannot be replaced.
    const Handle file(::CreateFileW(path.c_str(), GENERIC_WRITE, FILE_SHARE_READ | FILE_SHARE_WRITE,
                                    nullptr, OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr));
    return file && ::FlushFileBuffers(file.get()) ? std::error_code() : lastError();
}

std::error_code moveOver(const std::filesystem::path& from, const std::filesystem::path& to) {
    constexpr int attempts = 50;
    constexpr DWORD milliseconds = 10;
    for (int attempt = 1;; ++attempt) {
        if (::MoveFileExW(from.c_str(), to.c_str(),
                          MOVEFILE_REPLACE_EXISTING | MOVEFILE_WRITE_THROUGH))
            return {};
        const DWORD error = ::GetLastError();
        if (attempt == attempts || !isInUse(error, to))
            return errorOf(error);
        ::Sleep(milliseconds);
    }
}

std::optional<std::filesystem::path> symlinkTarget(const std::filesystem::path& path,
                                                   std::error_code& failure) {
    failure.clear();
    // The header of REPARSE_DATA_BUFFER for a symlink. Only the headers for drivers define it.
    struct Header {
        std::uint32_t tag;
        std::uint16_t length, reserved;
        std::uint16_t substituteOffset, substituteLength, printOffset, printLength;
        std::uint32_t flags;
    };
    const DWORD attributes = ::GetFileAttributesW(path.c_str());
    if (attributes == INVALID_FILE_ATTRIBUTES || !(attributes & FILE_ATTRIBUTE_REPARSE_POINT))
        return std::nullopt;
    const Handle link(::CreateFileW(
        path.c_str(), 0, FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
        OPEN_EXISTING, FILE_FLAG_OPEN_REPARSE_POINT | FILE_FLAG_BACKUP_SEMANTICS, nullptr));
    std::vector<char> data(MAXIMUM_REPARSE_DATA_BUFFER_SIZE);
    DWORD size = 0;
    if (!link || !::DeviceIoControl(link.get(), FSCTL_GET_REPARSE_POINT, nullptr, 0, data.data(),
                                    static_cast<DWORD>(data.size()), &size, nullptr))
        return std::nullopt;
    Header header{};
    if (size < sizeof header)
        return std::nullopt;
    std::memcpy(&header, data.data(), sizeof header);
    const std::size_t begin = sizeof header + header.printOffset;
    if (header.tag != IO_REPARSE_TAG_SYMLINK || size < begin + header.printLength)
        return std::nullopt;
    std::wstring text(header.printLength / sizeof(wchar_t), L'\0');
    std::memcpy(text.data(), data.data() + begin, text.size() * sizeof(wchar_t));
    return text;
}

std::wstring errorText(const std::error_code& error) {
    wchar_t text[512];
    DWORD length =
        ::FormatMessageW(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS, nullptr,
                         static_cast<DWORD>(error.value()), 0, text, 512, nullptr);
    while (length > 0 && (text[length - 1] <= L' ' || text[length - 1] == L'.'))
        --length;
    return length > 0 ? std::wstring(text, length) : L"error " + std::to_wstring(error.value());
}

std::filesystem::path programFile() {
    std::wstring name(MAX_PATH, L'\0');
    while (true) {
        const auto size = static_cast<DWORD>(name.size());
        const DWORD length = ::GetModuleFileNameW(nullptr, name.data(), size);
        if (length == 0)
            throw std::system_error(lastError(), "the program's file");
        if (length < size) {
            name.resize(length);
            return name;
        }
        name.resize(name.size() * 2);
    }
}

std::optional<std::filesystem::path> environmentPath(const char* name) {
    const std::wstring wide(name, name + std::strlen(name));
    std::wstring value(MAX_PATH, L'\0');
    while (true) {
        const auto size = static_cast<DWORD>(value.size());
        const DWORD length = ::GetEnvironmentVariableW(wide.c_str(), value.data(), size);
        if (length == 0)
            return std::nullopt;
        value.resize(length); // Without the terminator if it fitted, else with it.
        if (length < size)
            return value;
    }
}

std::filesystem::path resolveDots(const std::filesystem::path& path) {
    return path.lexically_normal();
}

} // namespace Mz::platform

// SPDX-License-Identifier: BSL-1.0
/// Reads a library through a file handle.
///
/// The file is opened with all sharing modes, so that other programs may read, write and delete it
/// meanwhile.
#include "components/platform/windows/exportReader.h"

#include "components/platform/windows/peProbe.h"

#include <windows.h>

namespace Mz::platform {

namespace {

/// The bytes of a file, which is open during the lifetime of the object.
class FileSource final : public ByteSource {
  public:
    explicit FileSource(const NativePath& path)
        : file(::CreateFileW(path.c_str(), GENERIC_READ,
                             FILE_SHARE_READ | FILE_SHARE_WRITE | FILE_SHARE_DELETE, nullptr,
                             OPEN_EXISTING, FILE_ATTRIBUTE_NORMAL, nullptr)),
          error(isOpen() ? ERROR_SUCCESS : ::GetLastError()) {
        LARGE_INTEGER value{};
        // A pipe or a device has no size here, so it is never read: that could block.
        if (isOpen() && ::GetFileType(file) == FILE_TYPE_DISK && ::GetFileSizeEx(file, &value))
            fileSize = static_cast<std::uint64_t>(value.QuadPart);
    }
    ~FileSource() {
        if (isOpen())
            ::CloseHandle(file);
    }
    FileSource(const FileSource&) = delete;
    FileSource& operator=(const FileSource&) = delete;

    bool isOpen() const { return file != INVALID_HANDLE_VALUE; }
    DWORD openError() const { return error; }

    /// Returns whether the system could not read something. The file is not at fault then.
    bool hasFailed() const { return failed; }

    std::uint64_t size() const override { return fileSize; }

    std::size_t read(std::uint64_t offset, void* data, std::size_t length) override {
        OVERLAPPED position{};
        position.Offset = static_cast<DWORD>(offset);
        position.OffsetHigh = static_cast<DWORD>(offset >> 32);
        DWORD done = 0;
        if (::ReadFile(file, data, static_cast<DWORD>(length), &done, &position))
            return done;
        failed = failed || ::GetLastError() != ERROR_HANDLE_EOF;
        return 0;
    }

  private:
    HANDLE file;
    DWORD error;
    std::uint64_t fileSize = 0;
    bool failed = false;
};

} // namespace

bool isShortage(unsigned long error) {
    switch (error) {
    case ERROR_TOO_MANY_OPEN_FILES:
    case ERROR_NOT_ENOUGH_MEMORY:
    case ERROR_OUTOFMEMORY:
    case ERROR_SHARING_BUFFER_EXCEEDED:
    case ERROR_NO_SYSTEM_RESOURCES:
    case ERROR_NONPAGED_SYSTEM_RESOURCES:
    case ERROR_PAGED_SYSTEM_RESOURCES:
    case ERROR_WORKING_SET_QUOTA:
    case ERROR_PAGEFILE_QUOTA:
    case ERROR_COMMITMENT_LIMIT:
    case ERROR_NOT_ENOUGH_QUOTA: return true;
    default: return false;
    }
}

ExportState readExport(const NativePath& path, const char* symbol) {
    FileSource file(path);
    if (!file.isOpen())
        return isShortage(file.openError()) ? ExportState::unknown : ExportState::absent;
    if (peExportsFunction(file, symbol))
        return ExportState::exported;
    return file.hasFailed() ? ExportState::unknown : ExportState::absent;
}

} // namespace Mz::platform

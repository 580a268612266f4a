// SPDX-License-Identifier: BSL-1.0
/// The lock of `flock`, which the system releases when the process ends, however it does. The file
/// gets its name after it is locked, so that it is never visible without the lock.
#include "components/componentTools/platform/system.h"

#include <cerrno>
#include <cstdio>
#include <fcntl.h>
#include <sys/file.h>
#include <unistd.h>

namespace Mz::Tools::System {

bool HeldFile::create(const NativePath& file) {
    const NativePath early =
        file.parent_path() / (".mz-" + std::to_string(::getpid()) + "-" + file.filename().string());
    const int descriptor =
        ::open(early.c_str(), O_RDWR | O_CREAT | O_TRUNC | O_CLOEXEC | O_NOFOLLOW, 0666);
    if (descriptor < 0)
        return false;
    if (::flock(descriptor, LOCK_EX | LOCK_NB) != 0 ||
        std::rename(early.c_str(), file.c_str()) != 0) {
        ::close(descriptor);
        ::unlink(early.c_str());
        return false;
    }
    path = file;
    handle = descriptor;
    return true;
}

bool HeldFile::write(const std::string& content) {
    const int descriptor = static_cast<int>(handle);
    return ::ftruncate(descriptor, 0) == 0 && ::pwrite(descriptor, content.data(), content.size(),
                                                       0) == static_cast<ssize_t>(content.size());
}

void HeldFile::remove() {
    if (handle >= 0)
        ::unlink(path.c_str());
}

HeldFile::~HeldFile() {
    if (handle >= 0)
        ::close(static_cast<int>(handle));
}

bool isHeld(const NativePath& file) {
    const int descriptor = ::open(file.c_str(), O_RDONLY | O_CLOEXEC);
    if (descriptor < 0)
        return false;
    const bool held = ::flock(descriptor, LOCK_SH | LOCK_NB) != 0 && errno == EWOULDBLOCK;
    ::close(descriptor);
    return held;
}

} // namespace Mz::Tools::System

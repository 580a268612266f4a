// SPDX-License-Identifier: BSL-1.0
/// What a process can give up before it runs untrusted code. The probe program alone links
/// the implementation, `confinement.cpp` in `posix/` or `windows/`.
#pragma once

namespace Mz::Tools::System {

/// What a process cannot do any more.
struct Confinement {
    bool files = false;     ///< create, change or remove files
    bool network = false;   ///< open connections
    bool processes = false; ///< start processes, or affect others
};

/// Gives up, for all threads that this one starts from now on, what the system lets a process give
/// up. Open files stay open, reading stays allowed, and libraries can be loaded. Returns what was
/// given up: everything on Linux, provided that the kernel has Landlock 3 and seccomp and the
/// program was built with libseccomp; nothing on Windows.
Confinement confineToReading();

} // namespace Mz::Tools::System

// SPDX-License-Identifier: BSL-1.0
/// Two mechanisms of the kernel, each of which is used if it is there. Landlock denies every way to
/// change a folder or the content of a file, TCP, and signals to other processes. Its header comes
/// with the compiler's C library, but may be older than the kernel, so the newer bits are repeated
/// here. seccomp denies system calls: sockets, new processes, and changes that Landlock does not
/// know, such as permissions. A denied call fails, as for a user without the permission, because an
/// importer may do without it.
#include "components/componentTools/platform/confinement.h"

#include <cerrno>
#include <cstddef>
#include <cstdint>
#include <fcntl.h>
#include <initializer_list>
#include <sys/prctl.h>
#include <sys/syscall.h>
#include <unistd.h>

#ifdef MZ_HAS_SECCOMP
#include <sched.h>
#include <seccomp.h>
#endif

namespace Mz::Tools::System {

namespace {

// ---- Landlock -------------------------------------------------------------------------------

/// What the kernel takes; older ones take the beginning only.
struct LandlockRules {
    std::uint64_t files, network, scopes;
};

/// Returns the bits from `first` to `last`.
constexpr std::uint64_t bits(int first, int last) {
    return (std::uint64_t{2} << last) - (std::uint64_t{1} << first);
}

/// The version in which Landlock got a right, and the bits of it.
struct LandlockRights {
    long version;
    std::uint64_t rights;
};

/// Returns the version of Landlock in the kernel; negative if there is none.
long landlockVersion() {
    constexpr unsigned int askVersion = 1;
    return ::syscall(SYS_landlock_create_ruleset, nullptr, 0, askVersion);
}

/// Returns the version of Landlock that now confines this thread; 0 for none.
long landlock() {
    const long version = landlockVersion();
    if (version < 1)
        return 0;
    LandlockRules rules{};
    constexpr LandlockRights ofFiles[] = {
        {1, bits(1, 1)},   // write
        {1, bits(4, 12)},  // remove and create
        {2, bits(13, 13)}, // rename and link to another folder
        {3, bits(14, 14)}, // truncate
    };
    for (const LandlockRights& right : ofFiles)
        if (version >= right.version)
            rules.files |= right.rights;
    if (version >= 4)
        rules.network = bits(0, 1); // TCP
    if (version >= 6)
        rules.scopes = bits(0, 1); // abstract sockets and signals
    const std::size_t size = version >= 6   ? sizeof rules
                             : version >= 4 ? offsetof(LandlockRules, scopes)
                                            : offsetof(LandlockRules, network);
    // No rule allows anything.
    const long set = ::syscall(SYS_landlock_create_ruleset, &rules, size, 0);
    if (set < 0)
        return 0;
    const long result = ::syscall(SYS_landlock_restrict_self, set, 0);
    ::close(static_cast<int>(set));
    return result == 0 ? version : 0;
}

// ---- seccomp --------------------------------------------------------------------------------

#ifdef MZ_HAS_SECCOMP

/// The system calls to deny, whatever their arguments.
constexpr int deniedCalls[] = {
    // network
    SCMP_SYS(socket), SCMP_SYS(connect), SCMP_SYS(bind), SCMP_SYS(listen), SCMP_SYS(accept),
    SCMP_SYS(accept4),
    // other processes
    SCMP_SYS(fork), SCMP_SYS(vfork), SCMP_SYS(execve), SCMP_SYS(execveat), SCMP_SYS(ptrace),
    SCMP_SYS(process_vm_readv), SCMP_SYS(process_vm_writev), SCMP_SYS(pidfd_open),
    SCMP_SYS(pidfd_getfd), SCMP_SYS(pidfd_send_signal), SCMP_SYS(setsid), SCMP_SYS(setpgid),
    SCMP_SYS(setpriority), SCMP_SYS(kcmp), SCMP_SYS(migrate_pages), SCMP_SYS(move_pages),
    // files
    SCMP_SYS(creat), SCMP_SYS(truncate), SCMP_SYS(rename), SCMP_SYS(renameat), SCMP_SYS(renameat2),
    SCMP_SYS(mkdir), SCMP_SYS(mkdirat), SCMP_SYS(rmdir), SCMP_SYS(unlink), SCMP_SYS(unlinkat),
    SCMP_SYS(link), SCMP_SYS(linkat), SCMP_SYS(symlink), SCMP_SYS(symlinkat), SCMP_SYS(mknod),
    SCMP_SYS(mknodat), SCMP_SYS(chmod), SCMP_SYS(fchmod), SCMP_SYS(fchmodat), SCMP_SYS(chown),
    SCMP_SYS(fchown), SCMP_SYS(lchown), SCMP_SYS(fchownat), SCMP_SYS(utime), SCMP_SYS(utimes),
    SCMP_SYS(futimesat), SCMP_SYS(utimensat), SCMP_SYS(setxattr), SCMP_SYS(lsetxattr),
    SCMP_SYS(fsetxattr), SCMP_SYS(removexattr), SCMP_SYS(lremovexattr), SCMP_SYS(fremovexattr),
    // the rest of the system
    SCMP_SYS(io_uring_setup), SCMP_SYS(keyctl), SCMP_SYS(add_key), SCMP_SYS(request_key),
    SCMP_SYS(bpf), SCMP_SYS(perf_event_open), SCMP_SYS(userfaultfd), SCMP_SYS(unshare),
    SCMP_SYS(setns), SCMP_SYS(mount), SCMP_SYS(umount2), SCMP_SYS(msgget), SCMP_SYS(semget),
    SCMP_SYS(shmget), SCMP_SYS(mq_open)};

/// Adds the rules for calls that are denied for certain arguments only. Returns whether the library
/// took them.
bool denyByArguments(scmp_filter_ctx filter) {
    const auto deny = SCMP_ACT_ERRNO(EPERM);
    const auto self = static_cast<scmp_datum_t>(::getpid());
    bool good = true;
    // Not the macros of the library, which are no standard C++.
    const auto add = [&](int call, const scmp_arg_cmp& condition) {
        good = ::seccomp_rule_add(filter, deny, call, 1, condition) == 0 && good;
    };
    for (const int number : {O_WRONLY, O_RDWR, O_CREAT, O_TRUNC}) {
        const auto flag = static_cast<scmp_datum_t>(number);
        add(SCMP_SYS(open), {1, SCMP_CMP_MASKED_EQ, flag, flag});
        add(SCMP_SYS(openat), {2, SCMP_CMP_MASKED_EQ, flag, flag});
    }
    for (const int call :
         {SCMP_SYS(kill), SCMP_SYS(tgkill), SCMP_SYS(rt_sigqueueinfo), SCMP_SYS(rt_tgsigqueueinfo)})
        add(call, {0, SCMP_CMP_NE, self, 0});
    add(SCMP_SYS(prlimit64), {0, SCMP_CMP_NE, 0, 0});
    // A thread is a new process with this flag.
    add(SCMP_SYS(clone), {0, SCMP_CMP_MASKED_EQ, CLONE_THREAD, 0});
    // Without them the C library uses the older calls, whose arguments can be read.
    for (const int call : {SCMP_SYS(clone3), SCMP_SYS(openat2)})
        good = ::seccomp_rule_add(filter, SCMP_ACT_ERRNO(ENOSYS), call, 0) == 0 && good;
    good = ::seccomp_rule_add(filter, deny, SCMP_SYS(tkill), 0) == 0 && good;
    return good;
}

/// Returns whether this thread is confined now.
bool seccomp() {
    const scmp_filter_ctx filter = ::seccomp_init(SCMP_ACT_ALLOW);
    if (!filter)
        return false;
    bool good = denyByArguments(filter);
    for (const int call : deniedCalls)
        good = ::seccomp_rule_add(filter, SCMP_ACT_ERRNO(EPERM), call, 0) == 0 && good;
    good = good && ::seccomp_load(filter) == 0;
    ::seccomp_release(filter);
    return good;
}

#else

bool seccomp() {
    return false;
}

#endif

} // namespace

Confinement confineToReading() {
    // Otherwise only a privileged process may confine itself.
    ::prctl(PR_SET_NO_NEW_PRIVS, 1, 0, 0, 0);
    const long version = landlock();
    const bool calls = seccomp();
    // seccomp alone covers opening and removing, too.
    return {version >= 3 || calls, calls, calls};
}

} // namespace Mz::Tools::System

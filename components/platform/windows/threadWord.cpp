// SPDX-License-Identifier: BSL-1.0
/// Thread-local words by an index of the system.
///
/// The index is allocated without a lock: threads that set the first value concurrently each
/// allocate one, and all but one of them free theirs again.
#include "components/platform/windows/threadWord.h"

#include <windows.h>

namespace Mz::platform {

namespace {

/// Preserves the caller's last error, which `TlsGetValue` clears.
class LastErrorGuard {
  public:
    LastErrorGuard() : error(::GetLastError()) {}
    ~LastErrorGuard() { ::SetLastError(error); }
    LastErrorGuard(const LastErrorGuard&) = delete;
    LastErrorGuard& operator=(const LastErrorGuard&) = delete;

  private:
    DWORD error;
};

} // namespace

std::uintptr_t ThreadSlot::get() const {
    const std::uint32_t taken = index.load(std::memory_order_acquire);
    if (taken == 0 || taken == released)
        return 0;
    const LastErrorGuard guard;
    return reinterpret_cast<std::uintptr_t>(::TlsGetValue(taken - 1));
}

bool ThreadSlot::set(std::uintptr_t value) {
    const LastErrorGuard guard;
    std::uint32_t taken = index.load(std::memory_order_acquire);
    if (taken == 0) {
        const DWORD allocated = ::TlsAlloc();
        if (allocated == TLS_OUT_OF_INDEXES)
            return false;
        if (index.compare_exchange_strong(taken, allocated + 1, std::memory_order_acq_rel))
            taken = allocated + 1;
        else
            ::TlsFree(allocated); // Another thread was faster.
    }
    return taken != released && ::TlsSetValue(taken - 1, reinterpret_cast<void*>(value)) != 0;
}

void ThreadSlot::release() {
    const std::uint32_t taken = index.exchange(released, std::memory_order_acq_rel);
    if (taken != 0 && taken != released)
        ::TlsFree(taken - 1);
}

} // namespace Mz::platform

#include "components/platform/windows/threadWord.h"

#include <windows.h>

namespace Mz::platform {

namespace {

/// Restores the caller's last error, which reading the memory of threads clears.
class SameLastError {
  public:
    SameLastError() : error(::GetLastError()) {}
    ~SameLastError() { ::SetLastError(error); }
    SameLastError(const SameLastError&) = delete;
    SameLastError& operator=(const SameLastError&) = delete;

  private:
    DWORD error;
};

} // namespace

std::uintptr_t ThreadPlace::get() const {
    const std::uint32_t taken = place.load(std::memory_order_acquire);
    if (taken == 0 || taken == released)
        return 0;
    const SameLastError same;
    return reinterpret_cast<std::uintptr_t>(::TlsGetValue(taken - 1));
}

bool ThreadPlace::set(std::uintptr_t value) {
    const SameLastError same;
    std::uint32_t taken = place.load(std::memory_order_acquire);
    if (taken == 0) {
        const DWORD index = ::TlsAlloc();
        if (index == TLS_OUT_OF_INDEXES)
            return false;
        if (place.compare_exchange_strong(taken, index + 1, std::memory_order_acq_rel))
            taken = index + 1;
        else
            ::TlsFree(index); // Another thread was faster.
    }
    return taken != released && ::TlsSetValue(taken - 1, reinterpret_cast<void*>(value)) != 0;
}

void ThreadPlace::release() {
    const std::uint32_t taken = place.exchange(released, std::memory_order_acq_rel);
    if (taken != 0 && taken != released)
        ::TlsFree(taken - 1);
}

} // namespace Mz::platform

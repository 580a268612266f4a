// SPDX-License-Identifier: BSL-1.0
/// Leaks one object, so that a test sees that the leak sanitizer is on in the build with
/// sanitizers.
#include <memory>

namespace {

/// Not inlined, so that no register keeps the address.
[[gnu::noinline]] int leak() {
    auto kept = std::make_unique<int>(7);
    return *kept.release();
}

} // namespace

int main() {
    return leak() == 7 ? 0 : 1;
}

// SPDX-License-Identifier: BSL-1.0
/// Takes every bit from `std::random_device`, which asks the system or the processor on both
/// platforms. A generator that is seeded would make the uids depend on one number of 32 bits.
#include "tools/mzcomponents/randomUid.h"

#include <cstdint>
#include <cstdio>
#include <iterator>
#include <random>

namespace Mz::Commands {

namespace {

std::string digitsOf(std::uint32_t word) {
    char text[9] = {};
    std::snprintf(text, std::size(text), "%08lX", static_cast<unsigned long>(word));
    return text;
}

} // namespace

QrUid randomUid() {
    static std::random_device source;
    static_assert(std::random_device::min() == 0 && std::random_device::max() == 0xFFFFFFFF);
    QrUid uid{source(), source(), source(), source()};
    uid.w1 = (uid.w1 & 0xFFFF0FFF) | 0x00004000; // version 4
    uid.w2 = (uid.w2 & 0x3FFFFFFF) | 0x80000000; // the variant of RFC 4122
    return uid;
}

std::string literalOf(const QrUid& uid) {
    std::string text = digitsOf(uid.w0) + digitsOf(uid.w1) + digitsOf(uid.w2) + digitsOf(uid.w3);
    for (const std::size_t hyphen : {8U, 13U, 18U, 23U})
        text.insert(hyphen, 1, '-');
    return text;
}

std::string wordsOf(const QrUid& uid) {
    return "{0x" + digitsOf(uid.w0) + ", 0x" + digitsOf(uid.w1) + ", 0x" + digitsOf(uid.w2) +
           ", 0x" + digitsOf(uid.w3) + "}";
}

} // namespace Mz::Commands

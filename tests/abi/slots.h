// SPDX-License-Identifier: BSL-1.0
/// Finds the vtable slots of virtual functions.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace Mz::Test {

/// Returns the vtable slot of a virtual function, -1 if it is not virtual. In the C++ ABI of both
/// platforms, a pointer to a virtual member has two parts: the offset of its slot plus one, and an
/// adjustment of `this`. On ARM processors, whose functions may have odd addresses, the offset is
/// as it is, and the adjustment is doubled, plus one.
template <class Member>
std::ptrdiff_t slotOf(Member member) {
    struct {
        std::ptrdiff_t tableOffset;
        std::ptrdiff_t adjustment;
    } parts;
    static_assert(sizeof member == sizeof parts);
    std::memcpy(&parts, &member, sizeof parts);
    constexpr std::ptrdiff_t notVirtual = -1;
#if defined(__aarch64__) || defined(__arm__)
    if (parts.adjustment != 1)
        return notVirtual;
#else
    if (parts.tableOffset % 2 == 0 || parts.adjustment != 0)
        return notVirtual;
#endif
    return parts.tableOffset / static_cast<std::ptrdiff_t>(sizeof(void*));
}

/// Gives access to the slot of a private function: `template struct RevealEnd<Class,
/// &Class::operation>;`. An explicit instantiation may name private members. It defines the friend
/// function, which must be declared before.
template <class Class, void (Class::*operation)()>
struct RevealEnd {
    friend std::ptrdiff_t endSlot(const Class*) { return slotOf(operation); }
};

/// Returns the number of slots of `Interface`: the slot of a function that is added after them.
template <class Interface>
std::ptrdiff_t slotCount() {
    struct Longer : Interface {
        virtual void behindAllOthers() = 0;
    };
    return slotOf(&Longer::behindAllOthers);
}

} // namespace Mz::Test

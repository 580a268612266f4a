// SPDX-License-Identifier: BSL-1.0
/// Where virtual operations stand in the tables of classes.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>

namespace Mz::Test {

/// The slot of a virtual operation. On the C++ ABI of both our platforms a pointer to a virtual
/// member is one more than the offset of its slot in the table, and an adjustment of `this`.
template <class Member>
std::ptrdiff_t slotOf(Member member) {
    struct {
        std::ptrdiff_t tableOffset;
        std::ptrdiff_t adjustment;
    } parts;
    static_assert(sizeof member == sizeof parts);
    std::memcpy(&parts, &member, sizeof parts);
    constexpr std::ptrdiff_t notVirtual = -1;
    if (parts.tableOffset % 2 == 0 || parts.adjustment != 0)
        return notVirtual;
    return parts.tableOffset / static_cast<std::ptrdiff_t>(sizeof(void*));
}

/// Tells the slot of a private operation, `template struct RevealEnd<Class, &Class::operation>;`:
/// an explicit instantiation may name what it likes. It defines the friend, which must be declared.
template <class Class, void (Class::*operation)()>
struct RevealEnd {
    friend std::ptrdiff_t endSlot(const Class*) { return slotOf(operation); }
};

/// How many slots the table of `Interface` has: the slot of the first operation behind them.
template <class Interface>
std::ptrdiff_t slotCount() {
    struct Longer : Interface {
        virtual void behindAllOthers() = 0;
    };
    return slotOf(&Longer::behindAllOthers);
}

} // namespace Mz::Test
